#include "desktop/drawing/DrawnImage.h"

#include <cairo.h>

#include "desktop/drawing/CairoImage.h"
#include "platform/foundation/Log.h"

namespace nimbo {

ImageRef drawImage(Size size, double scale, const std::function<void(cairo_t*)>& draw) {
  const auto surface = CairoSurface::make(size, scale);
  if (!surface) {
    writeLog({kDefaultLogSubsystem, "Images"}, LogLevel::error, "An image is not drawn: %@",
             {surface.error()->reason()});
    return nullptr;
  }
  {
    const CairoContextHandle context(cairo_create((*surface)->get()));
    draw(context.get());
  }
  return std::make_shared<const CairoImage>(*surface);
}

void setColor(cairo_t* context, const Color& color) {
  cairo_set_source_rgba(context, color.red, color.green, color.blue, color.alpha);
}

}  // namespace nimbo
