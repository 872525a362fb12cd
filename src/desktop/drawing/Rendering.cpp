#include "desktop/drawing/Rendering.h"

#include <cairo.h>

#include <string>

#include "desktop/drawing/CairoPainter.h"

namespace nimbo {

Outcome<CairoSurfaceRef> renderToSurface(const DrawOperation& draw, Size size, double scale, const Color& background) {
  auto surface = CairoSurface::make(size, scale);
  if (!surface) return surface;
  const CairoContextHandle context(cairo_create((*surface)->get()));
  cairo_set_source_rgba(context.get(), background.red, background.green, background.blue, background.alpha);
  cairo_paint(context.get());
  CairoPainter painter(context.get());
  draw(painter);
  if (const cairo_status_t status = cairo_status(context.get()); status != CAIRO_STATUS_SUCCESS)
    return Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), kDrawingErrorNotDrawn,
                                              std::string("Drawing the picture failed: ") +
                                                  cairo_status_to_string(status) + ". Try a smaller size or scale.");
  return surface;
}

ErrorRef renderToPNG(const DrawOperation& draw, Size size, double scale, const Color& background,
                     const std::filesystem::path& path) {
  const auto surface = renderToSurface(draw, size, scale, background);
  return surface ? (*surface)->writePNG(path) : surface.error();
}

}  // namespace nimbo
