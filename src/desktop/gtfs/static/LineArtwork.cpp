#include "desktop/gtfs/static/LineArtwork.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdio>

#include "desktop/gtfs/static/LineItems.h"
#include "desktop/gtfs/text/Utf8.h"
#include "desktop/strings/GraphemeClusters.h"

namespace nimbo {

namespace {

constexpr std::size_t kLongestShieldText = 10;  // characters
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

/// What a line is anyway.
bool isWordForLine(std::string_view word) {
  constexpr std::array<std::string_view, 7> kWords = {"line", "linie", "ligne", "línea", "linea", "linha", "lijn"};
  return std::find(kWords.begin(), kWords.end(), asciiLowerCase(word)) != kWords.end();
}

/// "4", "D", "T3a": what tells lines apart that begin alike.
bool isNumber(std::string_view word) {
  constexpr std::size_t kLongest = 3;
  const bool hasDigit = word.find_first_of("0123456789") != std::string_view::npos;
  return firstCharacters(word, hasDigit ? kLongest : 1) == word;
}

/// At most so many characters, whole as a reader sees them.
std::string_view head(std::string_view text, std::size_t characters) {
  return text.substr(0, clusterBoundary(text, firstCharacters(text, characters).size()));
}

bool fitsShield(std::string_view text) { return firstCharacters(text, kLongestShieldText) == text; }

/// The name without its words for a line; the name itself where it has no others.
std::string withoutWordsForLine(std::string_view name) {
  std::string text;
  for (std::string_view rest = name; !rest.empty();) {
    const std::string_view word = rest.substr(0, rest.find(' '));
    rest.remove_prefix(std::min(word.size() + 1, rest.size()));
    if (!word.empty() && !isWordForLine(word)) text.append(text.empty() ? "" : " ").append(word);
  }
  return text.empty() ? std::string(name) : text;
}

/// The name, or what a shield can hold of it and tells it from others: without its words for a line, cut after a word
/// where that fills more than half, else within a word. A number at the end stays: "Green D", "Straße… 12".
std::string shieldText(std::string_view name) {
  if (fitsShield(name)) return std::string(name);
  const std::string text = withoutWordsForLine(name);
  if (fitsShield(text)) return text;
  const std::size_t lastBlank = std::min(text.rfind(' '), text.size());
  const std::string end = lastBlank < text.size() && isNumber(text.substr(lastBlank + 1)) ? text.substr(lastBlank) : "";
  std::size_t room = kLongestShieldText;
  for (std::size_t position = 0; position < end.size(); --room) takeCharacter(end, position);
  const std::string_view whole = std::string_view(text).substr(0, text.size() - end.size());
  if (end.empty()) {
    constexpr std::string_view kBetweenWords = " /";
    const std::size_t most = head(whole, room).size();
    const std::size_t wordEnd = whole.find_last_of(kBetweenWords, most);
    if (wordEnd != std::string_view::npos && wordEnd > most / 2) return std::string(trimmed(whole.substr(0, wordEnd)));
  }
  const std::string_view begin = head(whole, room - 1);
  return std::string(begin.substr(0, begin.find_last_not_of(" /-") + 1)) + "…" + end;
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
