#pragma once

#include <string_view>

#include "desktop/drawing/DrawingPart.h"

namespace nimbo {

/// Pixels that a side of a published image may have.
inline constexpr int kLargestImageSide = 4096;

/// What libnimbo-images does, the part with Cairo and libjpeg-turbo (system/LatePart.h). Any thread.
class ImagesPart {
 public:
  virtual ~ImagesPart() = default;
  /// A PNG or JPEG file as pixels, scaled down to `width` where it is wider. Takes no memory for an image whose header
  /// tells of a side above `kLargestImageSide`. Errors are of `kDrawingErrorDomain`.
  virtual Outcome<PictureRef> decode(std::string_view file, int width) = 0;
};

/// Opens the part with the first call. Throws LatePartMissing.
ImagesPart& imagesPart();

}  // namespace nimbo
