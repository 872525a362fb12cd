// Rows of the incident list builder that speak for several lines.

#include <algorithm>
#include <functional>
#include <utility>

#include "items/NBConfiguredArtwork.h"
#include "items/NBTransitIncidentsDataSourceBuilder.h"
#include "platform/Localization.h"
#include "platform/artwork/ArtworkCache.h"

namespace nimbo {

namespace {

std::string filledText(std::string_view key, std::initializer_list<FormatArgument> arguments) {
  return LocalizedFormat(LocalizedString(key), arguments);
}

/// The same for rows that are equal.
std::uint64_t keyOfTexts(const NBTransitItem& item) {
  constexpr std::hash<std::optional<std::string>> hash;
  return hash(item.primaryText()) * 31 + hash(item.secondaryText());
}

/// The symbol of the system that all lines belong to. Lines without one are passed over until the first that has one;
/// after it they break what is common. Null where there is none.
TransitArtworkRef commonSystemArtwork(const TransitLineItems& lines) {
  TransitArtworkRef common;
  for (const TransitLineItemRef& line : lines) {
    const TransitArtworkRef artwork = line->system() ? line->system()->artwork() : nullptr;
    if (!common)
      common = artwork;
    else if (!artworksAreEquivalent(artwork.get(), common.get()))
      return nullptr;
  }
  return common;
}

/// The line's name, else its system's; null where both are missing or empty.
const std::string* nameOfLine(const TransitLineItem& line) {
  if (line.name() && !line.name()->empty()) return &*line.name();
  const TransitSystemRef& system = line.system();
  return system && system->name() && !system->name()->empty() ? &*system->name() : nullptr;
}

std::vector<std::string> distinctNames(const TransitLineItems& lines) {
  std::vector<std::string> names;
  for (const TransitLineItemRef& line : lines) {
    const std::string* name = nameOfLine(*line);
    if (name && std::find(names.begin(), names.end(), *name) == names.end()) names.push_back(*name);
  }
  return names;
}

}  // namespace

void NBTransitIncidentsDataSourceBuilder::_updateItemsAffectingSeveralLines_itemToLinesMap(
    NBTransitItems& items, ItemToLinesMap& itemToLines) const {
  const auto isOfSeveral = [](const RowLines& lines) { return !lines.others.empty(); };
  if (std::none_of(itemToLines.begin(), itemToLines.end(), isOfSeveral)) return;
  std::vector<std::uint64_t> keys;
  for (const NBTransitItemRef& item : items) keys.push_back(keyOfTexts(*item));
  const auto placeOf = [&](auto key) { return static_cast<std::size_t>(key - keys.begin()); };
  for (std::size_t row = 0; row < items.size(); ++row) {
    if (!isOfSeveral(itemToLines[row])) continue;
    const NBTransitItemRef old = items[row];
    auto found = std::find(keys.begin(), keys.end(), keys[row]);
    while (!items[placeOf(found)]->isEqual(old.get())) found = std::find(found + 1, keys.end(), keys[row]);
    const std::size_t place = placeOf(found);
    items[place] = itemAffectingLines(*old, itemToLines[row].all());
    *found = keyOfTexts(*items[place]);
    itemToLines[place] = std::exchange(itemToLines[row], {});
  }
}

TransitLineItems NBTransitIncidentsDataSourceBuilder::RowLines::all() const {
  TransitLineItems lines{first};
  lines.insert(lines.end(), others.begin(), others.end());
  return lines;
}

NBTransitItemRef NBTransitIncidentsDataSourceBuilder::itemAffectingLines(const NBTransitItem& item,
                                                                         const TransitLineItems& lines) const {
  auto common = commonSystemArtwork(lines);
  auto artwork = common ? NBConfiguredArtwork::initWithArtworkSource_alpha(
                              SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(
                                  std::move(common), kRowShieldSize, _artworkCache),
                              kFullArtworkAlpha)
                        : artworkOfImageNamed("WidgetGenericTransit", kDimmedArtworkAlpha);
  return item.copyWithSecondaryText_artwork(_prependLineNames_toText(lines, item.secondaryText()), std::move(artwork));
}

std::optional<std::string> NBTransitIncidentsDataSourceBuilder::_prependLineNames_toText(
    const TransitLineItems& lines, const std::optional<std::string>& text) {
  std::vector<std::string> names = distinctNames(lines);
  if (names.empty()) return text;
  const bool hasText = text && !text->empty();
  const std::size_t count = names.size();
  const std::string last = std::move(names.back());
  names.pop_back();
  if (!hasText) {
    if (count == 1) return last;
    if (count == 2) return filledText("TransitWidget_2_Lines_Concatenated", {names.front(), last});
    return filledText("TransitWidget_N_Lines_Names_Concatenated", {CommaDelimitedList(names), last});
  }
  if (count == 1) return filledText("TransitWidget_Single_Line_Prepended_Incident_Text", {last, *text});
  if (count == 2) return filledText("TransitWidget_2_Lines_Prepended_Incident_Text", {names.front(), last, *text});
  return filledText("TransitWidget_N_Lines_Prepended_Incident_Text", {CommaDelimitedList(names), last, *text});
}

}  // namespace nimbo
