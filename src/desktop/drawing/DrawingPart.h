#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "platform/artwork/ArtworkCache.h"
#include "platform/artwork/ArtworkImageSource.h"
#include "platform/foundation/Error.h"
#include "platform/foundation/Outcome.h"
#include "platform/ui/Painter.h"
#include "platform/ui/TextSystem.h"

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
};

using PictureRef = std::shared_ptr<const Picture>;

/// What draws a picture: called once, at once, with the origin at the top left.
using DrawOperation = std::function<void(Painter&)>;

/// What libnimbo-drawing does, the part with Pango and Cairo (system/LatePart.h). Main thread only.
class DrawingPart {
 public:
  virtual ~DrawingPart() = default;

  /// Begins to look for fonts, on a thread of Pango's: for a program that will show text soon, and has other things to
  /// do until then.
  virtual void lookForFonts() = 0;
  /// `language` is the user's, as a BCP 47 tag.
  virtual std::unique_ptr<TextSystem> makeTextSystem(const std::string& language) = 0;
  virtual std::unique_ptr<ImageResources> makeImages() = 0;
  /// `text` is of this part and outlives the renderer.
  virtual std::unique_ptr<ShieldIconRenderer> makeShieldRenderer(TextSystem& text) = 0;
  /// A picture of `size` points at `scale` device pixels a point, over `background`, which shows what the services of
  /// this part made.
  virtual Outcome<PictureRef> render(const DrawOperation& draw, Size size, double scale, const Color& background) = 0;
  /// Pixels such as those of a Picture, `width` in a row and `stride` bytes, a multiple of four, from a row to the
  /// next, as a PNG file, which is replaced whole or not at all. Null on success.
  virtual ErrorRef writePNG(std::span<const std::uint8_t> pixels, int width, int stride,
                            const std::filesystem::path& path) = 0;
};

/// Opens the part with the first call. Throws LatePartMissing.
DrawingPart& drawingPart();

}  // namespace nimbo
