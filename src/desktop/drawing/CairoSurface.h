#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string_view>
#include <utility>

#include "desktop/raii/CairoHandles.h"
#include "platform/foundation/Geometry.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

inline constexpr std::string_view kDrawingErrorDomain = "DrawingErrorDomain";
inline constexpr std::int64_t kDrawingErrorBadSize = 1;  ///< a size or scale that no picture has, or one too large
inline constexpr std::int64_t kDrawingErrorNotDrawn =
    2;  ///< the drawing library gave up, most likely for lack of memory

/// Pixels that a picture may have at most: 256 MiB of memory.
inline constexpr double kMaximumPixelCount = 64e6;

class CairoSurface;
/// Never null.
using CairoSurfaceRef = std::shared_ptr<const CairoSurface>;

/// A picture's pixels in memory. One thread at a time.
class CairoSurface final {
 public:
  /// Transparent pixels for `size` points, `scale` of them for each point, broken ones counted whole and at least one
  /// each way. Refused: a size or scale that is no number or negative, a scale of 0, more than `kMaximumPixelCount`.
  static Outcome<CairoSurfaceRef> make(Size size, double scale);

  CairoSurface(CairoSurfaceHandle handle, Size size, double scale)
      : _surface(std::move(handle)), _size(size), _scale(scale) {}

  /// Points, as asked for.
  Size size() const { return _size; }
  /// Device pixels for each point.
  double scale() const { return _scale; }
  int pixelWidth() const;
  int pixelHeight() const;
  /// Bytes from a row of pixels to the next.
  int stride() const;
  /// Rows from the top; a pixel is 32 bits of the machine's byte order, alpha in the highest eight, then red, green and
  /// blue, multiplied by alpha. Drawing that is under way is finished first. As long as the surface lives.
  std::span<const std::uint8_t> pixels() const;

  /// Its user unit is the point. Never null.
  cairo_surface_t* get() const { return _surface.get(); }

 private:
  CairoSurfaceHandle _surface;
  Size _size;
  double _scale;
};

}  // namespace nimbo
