#pragma once

#include "platform/foundation/Geometry.h"

namespace nimbo {

/// The room for the shield column, in points.
struct ArtworkWidthCalculatorSizeParameter {
  double defaultArtworkViewWidth = 0;  ///< the narrowest the column may be, and its width without shields
  double maxArtworkViewWidth = 0;      ///< the widest the column may be
  Insets artworkInsets;                ///< left and right are added to every shield's width
  bool operator==(const ArtworkWidthCalculatorSizeParameter&) const = default;
};

}  // namespace nimbo
