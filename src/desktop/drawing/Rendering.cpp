#include "desktop/drawing/Rendering.h"

#include <cairo.h>

#include <cerrno>
#include <string>

#include "desktop/drawing/CairoPainter.h"
#include "desktop/system/AtomicFile.h"

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
  return surface ? writePNG(**surface, path) : surface.error();
}

ErrorRef writePNG(const CairoSurface& surface, const std::filesystem::path& path) {
  // A folder that is missing is a slip of the hand, not a wish for one.
  std::error_code ignored;
  if (const auto folder = path.parent_path(); !folder.empty() && !std::filesystem::is_directory(folder, ignored))
    return fileError("write", path, ENOENT);
  std::string bytes;
  const auto append = [](void* closure, const unsigned char* data, unsigned int length) {
    static_cast<std::string*>(closure)->append(reinterpret_cast<const char*>(data), length);
    return CAIRO_STATUS_SUCCESS;
  };
  const cairo_status_t status = cairo_surface_write_to_png_stream(surface.get(), append, &bytes);
  if (status != CAIRO_STATUS_SUCCESS)
    return Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), kDrawingErrorNotDrawn,
                                              "Cannot encode " + path.native() + " as PNG: " +
                                                  cairo_status_to_string(status) + ". Try a smaller size or scale.");
  return writeFileAtomically(path, bytes);
}

}  // namespace nimbo
