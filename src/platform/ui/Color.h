#pragma once

#include <optional>
#include <string_view>

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

}  // namespace nimbo
