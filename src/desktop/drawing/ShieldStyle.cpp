#include "desktop/drawing/ShieldStyle.h"

#include <algorithm>

#include "platform/ui/Color.h"

namespace nimbo {

namespace {

// Size 7 stands beside a headline, and leaves 8 points above and below in rows down to 46 points. The widest shield
// fits the narrowest column, 73 points, and leaves a gap between itself and the texts.
constexpr ShieldMetrics kMetrics[] = {
    // height, text, smallest text, padding, corner radius, maximum width
    {16, 9.5, 7.0, 4.0, 3.5, 40},    // 0
    {18, 10.5, 7.5, 4.5, 4.0, 44},   // 1
    {20, 11.5, 8.0, 5.0, 4.5, 48},   // 2
    {22, 12.5, 8.5, 5.5, 5.0, 52},   // 3
    {24, 13.5, 9.0, 6.0, 5.5, 56},   // 4
    {26, 14.5, 9.5, 6.5, 6.0, 60},   // 5
    {28, 15.5, 10.0, 7.0, 6.5, 64},  // 6
    {30, 16.5, 10.5, 7.5, 7.0, 68},  // 7
};

constexpr Color kBlack{0, 0, 0, 1};
constexpr Color kWhite{1, 1, 1, 1};

constexpr Color neutralFill(bool nightMode) {
  return nightMode ? Color{0.62, 0.65, 0.70, 1} : Color{0.36, 0.40, 0.46, 1};
}

/// Source: WCAG 2.1, success criterion 1.4.3.
constexpr double kLegibleContrast = 4.5;

/// Below this contrast a shield's edge is lost in its row.
constexpr double kVisibleContrast = 1.3;

ShieldColors colorsOnFill(const Color& fill, std::optional<Color> wanted, bool nightMode) {
  ShieldColors colors{fill, {}, {0, 0, 0, 0}};
  if (wanted && contrastRatio(*wanted, fill) >= kLegibleContrast)
    colors.text = *wanted;
  else
    colors.text = contrastRatio(kBlack, fill) > contrastRatio(kWhite, fill) ? kBlack : kWhite;
  if (contrastRatio(fill, colorOf(SystemColor::background, nightMode ? Appearance::dark : Appearance::light)) <
      kVisibleContrast)
    colors.outline = nightMode ? Color{1, 1, 1, 0.45} : Color{0, 0, 0, 0.4};
  return colors;
}

std::optional<Color> parsedColor(const std::optional<std::string>& text) {
  return text ? colorFromHexText(*text) : std::nullopt;
}

}  // namespace

const ShieldMetrics& shieldMetrics(std::int64_t shieldSize) {
  return kMetrics[std::clamp<std::int64_t>(shieldSize, 0, std::size(kMetrics) - 1)];
}

ShieldColors shieldColors(const TransitShield& shield, bool nightMode) {
  const auto fill = parsedColor(shield.shieldColorString);
  return colorsOnFill(fill.value_or(neutralFill(nightMode)), parsedColor(shield.shieldTextColorString), nightMode);
}

ShieldColors symbolColors(bool nightMode) { return colorsOnFill(neutralFill(nightMode), {}, nightMode); }

}  // namespace nimbo
