#include "desktop/drawing/CairoImage.h"

#include <cairo.h>

#include "desktop/drawing/VectorImage.h"
#include "platform/foundation/Log.h"
#include "platform/ui/Color.h"

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

ImageRef CairoImageResources::image(std::string_view name, double screenScale, bool nightMode) {
  // The widget has four images; more than this many are other scales and names that do not exist.
  constexpr std::size_t kMaximumKept = 32;
  if (_images.size() > kMaximumKept) _images.clear();
  const auto [entry, isNew] = _images.try_emplace({std::string(name), screenScale, nightMode});
  if (!isNew) return entry->second;
  if (const VectorImage* drawing = vectorImageNamed(name)) {
    const Size size = drawing->size;
    entry->second = drawImage(size, screenScale, [&](cairo_t* context) {
      drawing->draw(context, {0, 0, size.width, size.height},
                    colorOf(SystemColor::label, nightMode ? Appearance::dark : Appearance::light));
    });
  }
  return entry->second;
}

}  // namespace nimbo
