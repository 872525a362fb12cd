#include "desktop/gtfs/LineArtwork.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

#include "desktop/gtfs/LineNames.h"
#include "desktop/gtfs/Utf8.h"

namespace nimbo {

namespace {

constexpr std::size_t kLongestShieldText = 12;  // characters
constexpr double kLeastContrast = 4.5;
constexpr std::uint32_t kBlack = 0x000000, kWhite = 0xFFFFFF;

double luminance(std::uint32_t color) {
  const auto channel = [&](int shift) {
    const double value = ((color >> shift) & 0xFF) / 255.0;
    return value <= 0.03928 ? value / 12.92 : std::pow((value + 0.055) / 1.055, 2.4);
  };
  return 0.2126 * channel(16) + 0.7152 * channel(8) + 0.0722 * channel(0);
}

double contrast(std::uint32_t a, std::uint32_t b) {
  const double x = luminance(a), y = luminance(b);
  return (std::max(x, y) + 0.05) / (std::min(x, y) + 0.05);
}

/// The name, cut after a word where there is room for one, else within it.
std::string shieldText(std::string_view name) {
  const std::string_view head = firstCharacters(name, kLongestShieldText);
  if (head.size() == name.size()) return std::string(name);
  const std::size_t wordEnd = name[head.size()] == ' ' ? head.size() : head.rfind(' ');
  if (wordEnd != std::string_view::npos && wordEnd >= 3) return std::string(trimmed(head.substr(0, wordEnd)));
  return std::string(firstCharacters(name, kLongestShieldText - 1)) + "…";
}

ShieldType shieldTypeFor(TransitMode mode, std::string_view text) {
  switch (mode) {
    case TransitMode::subway:
      return firstCharacters(text, 2) == text ? ShieldType::circle : ShieldType::pill;
    case TransitMode::rail:
    case TransitMode::ferry:
      return ShieldType::pill;
    default:
      return ShieldType::roundedBox;
  }
}

}  // namespace

std::uint32_t readableTextColor(std::uint32_t color, std::optional<std::uint32_t> published) {
  if (published && contrast(color, *published) >= kLeastContrast) return *published;
  return contrast(color, kBlack) >= contrast(color, kWhite) ? kBlack : kWhite;
}

std::string colorString(std::uint32_t color) {
  char text[8];
  std::snprintf(text, sizeof text, "#%06x", color & 0xFFFFFF);
  return text;
}

TransitArtworkRef modeArtwork(TransitMode mode, ArtworkUseType use) {
  if (mode == TransitMode::unknown) return nullptr;
  TransitArtwork::Fields fields;
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::icon);
  fields.artworkUseType = static_cast<std::int64_t>(use);
  fields.iconDataSource = TransitIcon{1, 0, static_cast<std::int64_t>(mode), 0, 0};
  return std::make_shared<const TransitArtwork>(std::move(fields));
}

TransitArtworkRef lineArtwork(const StaticLine& line) {
  const TransitMode mode = modeOfRouteType(line.type);
  const std::string_view name = nameOfLine(line);
  if (name.empty()) return modeArtwork(mode, ArtworkUseType::line);
  TransitShield shield;
  shield.shieldText = shieldText(name);
  shield.shieldType = static_cast<std::int64_t>(shieldTypeFor(mode, *shield.shieldText));
  if (line.color) {
    shield.shieldColorString = colorString(*line.color);
    shield.shieldTextColorString = colorString(readableTextColor(*line.color, line.textColor));
  }
  TransitArtwork::Fields fields;
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::shield);
  fields.artworkUseType = static_cast<std::int64_t>(ArtworkUseType::line);
  fields.shieldDataSource = std::move(shield);
  fields.accessibilityText = fullNameOfLine(line);
  return std::make_shared<const TransitArtwork>(std::move(fields));
}

}  // namespace nimbo
