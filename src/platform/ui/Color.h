#pragma once

#include <optional>
#include <string_view>

#include "platform/ui/Environment.h"

namespace nimbo {

/// sRGB, not premultiplied, each from 0 to 1.
struct Color {
  double red = 0, green = 0, blue = 0, alpha = 1;
  bool operator==(const Color&) const = default;
};

/// "#rrggbb" or "rrggbb", any case; absent for anything else.
std::optional<Color> colorFromHexText(std::string_view text);

/// Contrast of two opaque colours, 1 to 21. Source: WCAG 2.1, "contrast ratio".
double contrastRatio(const Color& a, const Color& b);

/// Colours by what they are for.
enum class SystemColor {
  background,    ///< behind the widget
  label,         ///< texts
  systemGrey,    ///< texts that stand back
  rowHighlight,  ///< behind a touched row
};

/// Texts have a contrast of 4.5 to 1 or more on the background and on a touched row.
Color colorOf(SystemColor color, Appearance appearance);

}  // namespace nimbo
