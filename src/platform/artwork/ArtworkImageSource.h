#pragma once

#include "platform/artwork/Image.h"

namespace nimbo {

/// Something that an image view can show: described by value, drawn when asked.
class ArtworkImageSource : public Object {
 public:
  /// The picture for a screen scale and an appearance; null when it cannot be drawn. Main thread only.
  virtual ImageRef imageToDisplayWithScreenScale_nightMode(double screenScale, bool nightMode) const = 0;
};

using ArtworkImageSourceRef = std::shared_ptr<const ArtworkImageSource>;

}  // namespace nimbo
