#pragma once

#include <filesystem>
#include <utility>

#include "desktop/drawing/DrawingPart.h"
#include "desktop/raii/CairoHandles.h"
#include "platform/foundation/Geometry.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// Pixels that a picture may have at most: 256 MiB of memory.
inline constexpr double kMaximumPixelCount = 64e6;

class CairoSurface;
/// Never null.
using CairoSurfaceRef = std::shared_ptr<const CairoSurface>;

/// A picture that Cairo draws on.
class CairoSurface final : public Picture {
 public:
  /// Transparent pixels for `size` points, `scale` of them for each point, broken ones counted whole and at least one
  /// each way. Refused: a size or scale that is no number or negative, a scale of 0, more than `kMaximumPixelCount`.
  static Outcome<CairoSurfaceRef> make(Size size, double scale);

  CairoSurface(CairoSurfaceHandle handle, Size size, double scale)
      : _surface(std::move(handle)), _size(size), _scale(scale) {}

  /// Points, as asked for.
  Size size() const { return _size; }
  double scale() const override { return _scale; }
  int pixelWidth() const override;
  int pixelHeight() const override;
  int stride() const override;
  std::span<const std::uint8_t> pixels() const override;
  /// As a PNG file, replaced whole or not at all. Null on success.
  ErrorRef writePNG(const std::filesystem::path& path) const;

  /// Its user unit is the point. Never null.
  cairo_surface_t* get() const { return _surface.get(); }

 private:
  CairoSurfaceHandle _surface;
  Size _size;
  double _scale;
};

/// A picture of `size` points at `scale` device pixels a point, over `background`. Errors are those of
/// `CairoSurface::make`. Main thread.
Outcome<CairoSurfaceRef> renderToSurface(const DrawOperation& draw, Size size, double scale, const Color& background);

/// The same as a PNG file at `path`, replaced whole or not at all. Null on success.
ErrorRef renderToPNG(const DrawOperation& draw, Size size, double scale, const Color& background,
                     const std::filesystem::path& path);

}  // namespace nimbo
