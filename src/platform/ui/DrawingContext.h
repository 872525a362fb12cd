#pragma once

#include <optional>

#include "platform/ui/Color.h"
#include "platform/ui/Environment.h"

namespace nimbo {

/// What a view that draws itself inherits from those it is in.
struct DrawingContext {
  Appearance appearance = Appearance::light;
  double screenScale = 1;
  std::optional<Color> vibrantColor;  ///< in place of the colours of texts and images, inside a visual effect
};

}  // namespace nimbo
