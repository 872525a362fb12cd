#include "desktop/drawing/Rendering.h"

#include <cairo.h>

#include <string>

#include "desktop/drawing/CairoPainter.h"

namespace nimbo {

CairoSurface::Made renderToSurface(const DrawOperation& draw, Size size, double scale, const Color& background) {
  CairoSurface::Made made = CairoSurface::make(size, scale);
  if (!made.surface) return made;
  const CairoContextHandle context(cairo_create(made.surface->get()));
  cairo_set_source_rgba(context.get(), background.red, background.green, background.blue, background.alpha);
  cairo_paint(context.get());
  CairoPainter painter(context.get());
  draw(painter);
  if (const cairo_status_t status = cairo_status(context.get()); status != CAIRO_STATUS_SUCCESS)
    return {nullptr,
            Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), kDrawingErrorNotDrawn,
                                               std::string("Drawing the picture failed: ") +
                                                   cairo_status_to_string(status) + ". Try a smaller size or scale.")};
  return made;
}

ErrorRef renderToPNG(const DrawOperation& draw, Size size, double scale, const Color& background,
                     const std::filesystem::path& path) {
  const CairoSurface::Made made = renderToSurface(draw, size, scale, background);
  return made.surface ? made.surface->writePNG(path) : made.error;
}

}  // namespace nimbo
