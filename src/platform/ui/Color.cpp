#include "platform/ui/Color.h"

#include <algorithm>
#include <charconv>
#include <cmath>

namespace nimbo {

std::optional<Color> colorFromHexText(std::string_view text) {
  if (text.starts_with('#')) text.remove_prefix(1);
  if (text.size() != 6) return std::nullopt;
  unsigned value = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value, 16);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  const auto part = [value](int shift) { return ((value >> shift) & 0xff) / 255.0; };
  return Color{part(16), part(8), part(0), 1};
}

double contrastRatio(const Color& a, const Color& b) {
  const auto linear = [](double c) { return c <= 0.03928 ? c / 12.92 : std::pow((c + 0.055) / 1.055, 2.4); };
  const auto luminance = [&](const Color& c) {
    return 0.2126 * linear(c.red) + 0.7152 * linear(c.green) + 0.0722 * linear(c.blue);
  };
  const double x = luminance(a), y = luminance(b);
  return (std::max(x, y) + 0.05) / (std::min(x, y) + 0.05);
}

namespace {

constexpr Color rgb(int red, int green, int blue) { return {red / 255.0, green / 255.0, blue / 255.0, 1}; }

}  // namespace

Color colorOf(SystemColor color, Appearance appearance) {
  const bool dark = appearance == Appearance::dark;
  switch (color) {
    case SystemColor::background:
      return dark ? rgb(30, 30, 32) : rgb(246, 246, 248);
    case SystemColor::label:
      return dark ? rgb(255, 255, 255) : rgb(0, 0, 0);
    case SystemColor::systemGrey:
      return dark ? rgb(166, 166, 172) : rgb(96, 96, 102);
    case SystemColor::rowHighlight:
      return dark ? rgb(52, 52, 56) : rgb(226, 226, 230);
  }
  return {};
}

}  // namespace nimbo
