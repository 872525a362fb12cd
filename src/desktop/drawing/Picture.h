#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <span>
#include <string_view>

#include "platform/foundation/Error.h"

namespace nimbo {

inline constexpr std::string_view kDrawingErrorDomain = "DrawingErrorDomain";
inline constexpr std::int64_t kDrawingErrorBadSize = 1;  ///< a size or scale that no picture has, or one too large
inline constexpr std::int64_t kDrawingErrorNotDrawn =
    2;  ///< the drawing library gave up, most likely for lack of memory

/// A picture's pixels in memory. One thread at a time.
class Picture {
 public:
  virtual ~Picture() = default;
  virtual int pixelWidth() const = 0;
  virtual int pixelHeight() const = 0;
  /// Device pixels for each point.
  virtual double scale() const = 0;
  /// Bytes from a row of pixels to the next.
  virtual int stride() const = 0;
  /// Rows from the top; a pixel is 32 bits of the machine's byte order, alpha in the highest eight, then red, green and
  /// blue, multiplied by alpha. Drawing that is under way is finished first. As long as the picture lives.
  virtual std::span<const std::uint8_t> pixels() const = 0;
  /// As a PNG file, replaced whole or not at all. Null on success.
  virtual ErrorRef writePNG(const std::filesystem::path& path) const = 0;
};

using PictureRef = std::shared_ptr<const Picture>;

}  // namespace nimbo
