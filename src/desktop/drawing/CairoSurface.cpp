#include "desktop/drawing/CairoSurface.h"

#include <cairo.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <string>

#include "desktop/drawing/CairoPainter.h"
#include "desktop/system/AtomicFile.h"

namespace nimbo {

namespace {

/// Cairo's image surfaces hold coordinates of 16 bits.
constexpr double kMaximumPixelsEachWay = 32767;

ErrorRef badSize(Size size, double scale, const char* problem) {
  char text[256];
  std::snprintf(text, sizeof text, "A picture of %g by %g points at scale %g %s", size.width, size.height, scale,
                problem);
  return Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), kDrawingErrorBadSize, text);
}

double pixelCount(double points, double scale) {
  // A hair less, so that 10.1 points at scale 10 are not 102 pixels.
  return std::max(1.0, std::ceil(points * scale - 1e-6));
}

}  // namespace

Outcome<CairoSurfaceRef> CairoSurface::make(Size size, double scale) {
  const auto isLength = [](double value) { return std::isfinite(value) && value >= 0; };
  if (!isLength(size.width) || !isLength(size.height) || !isLength(scale) || scale == 0)
    return badSize(size, scale, "cannot be drawn: give lengths of at least 0 and a scale above 0.");
  const double width = pixelCount(size.width, scale), height = pixelCount(size.height, scale);
  if (width > kMaximumPixelsEachWay || height > kMaximumPixelsEachWay || width * height > kMaximumPixelCount)
    return badSize(size, scale, "is too large: choose a smaller size or scale.");
  CairoSurfaceHandle handle(
      cairo_image_surface_create(CAIRO_FORMAT_ARGB32, static_cast<int>(width), static_cast<int>(height)));
  if (cairo_surface_status(handle.get()) != CAIRO_STATUS_SUCCESS)
    return badSize(size, scale, "does not fit into memory: choose a smaller size or scale.");
  cairo_surface_set_device_scale(handle.get(), scale, scale);
  return std::make_shared<const CairoSurface>(std::move(handle), size, scale);
}

int CairoSurface::pixelWidth() const { return cairo_image_surface_get_width(get()); }

int CairoSurface::pixelHeight() const { return cairo_image_surface_get_height(get()); }

int CairoSurface::stride() const { return cairo_image_surface_get_stride(get()); }

std::span<const std::uint8_t> CairoSurface::pixels() const {
  cairo_surface_flush(get());
  return {cairo_image_surface_get_data(get()),
          static_cast<std::size_t>(stride()) * static_cast<std::size_t>(pixelHeight())};
}

ErrorRef CairoSurface::writePNG(const std::filesystem::path& path) const {
  // A folder that is missing is a slip of the hand, not a wish for one.
  std::error_code ignored;
  if (const auto folder = path.parent_path(); !folder.empty() && !std::filesystem::is_directory(folder, ignored))
    return fileError("write", path, ENOENT);
  std::string bytes;
  const auto append = [](void* closure, const unsigned char* data, unsigned int length) {
    static_cast<std::string*>(closure)->append(reinterpret_cast<const char*>(data), length);
    return CAIRO_STATUS_SUCCESS;
  };
  const cairo_status_t status = cairo_surface_write_to_png_stream(get(), append, &bytes);
  if (status != CAIRO_STATUS_SUCCESS)
    return Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), kDrawingErrorNotDrawn,
                                              "Cannot encode " + path.native() + " as PNG: " +
                                                  cairo_status_to_string(status) + ". Try a smaller size or scale.");
  return writeFileAtomically(path, bytes);
}

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
