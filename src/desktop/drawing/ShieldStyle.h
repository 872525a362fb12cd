#pragma once

#include <cstdint>

#include "platform/transit/TransitArtwork.h"
#include "platform/ui/Color.h"

namespace nimbo {

/// Measures of one shield size, in points.
struct ShieldMetrics {
  double height;
  double textSize;          ///< of the bold face
  double smallestTextSize;  ///< to which a text that is too wide shrinks before it is condensed and loses its end
  double padding;           ///< between the edge and the text at each side, where the text leaves so much
  double cornerRadius;
  double maximumWidth;  ///< of the whole image, with its badge
};

/// Of a shield size from 0 to 7; others are taken to the nearest.
const ShieldMetrics& shieldMetrics(std::int64_t shieldSize);

/// Colours of one shield on its row.
struct ShieldColors {
  Color fill;
  Color text;
  Color outline;  ///< of alpha 0 where the fill stands out from the row by itself
};

/// The shield's own text colour is kept where its contrast with the fill is at least 4.5; otherwise the text is black
/// or white, whichever contrasts more.
ShieldColors shieldColors(const TransitShield& shield, bool nightMode);

/// Colour of a mode's symbol, on a tile of the neutral fill.
ShieldColors symbolColors(bool nightMode);

}  // namespace nimbo
