// The rows of the incident list builder: their texts, artworks and openables.

#include <algorithm>
#include <utility>

#include "handoff/NBOpenable.h"
#include "handoff/NBUserActivityData.h"
#include "items/NBConfiguredArtwork.h"
#include "items/NBTransitIncidentsDataSourceBuilder.h"
#include "platform/Localization.h"
#include "platform/UserSession.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/transit/IncidentStringProvider.h"

namespace nimbo {

namespace {

/// Opens the map application at its transit map.
constexpr const char* kTransitMapURL = "nimbo://?t=r";
/// Which favourites the map application shows: the transit lines.
constexpr int kFavoritesTypeTransitLines = 2;

std::string textWithCount(std::string_view key, std::size_t count) {
  return LocalizedFormat(LocalizedString(key), {std::uint64_t{count}});
}

/// The shield that rows show for a line; null where it has none.
TransitArtworkRef shieldOfLine(const TransitLineItem& line) {
  if (line.alternateArtwork()) return line.alternateArtwork();
  return line.system() ? line.system()->artwork() : nullptr;
}

}  // namespace

NBTransitItemRef NBTransitIncidentsDataSourceBuilder::_noFavoritesItem() const {
  return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      LocalizedString("TransitWidget_NoFavoriteTransitLines_Title"),
      LocalizedString("TransitWidget_NoFavoriteTransitLines_SecondaryText"), nullptr, true,
      std::make_shared<const NBURLOpenable>(URL(kTransitMapURL)));
}

NBTransitItemRef NBTransitIncidentsDataSourceBuilder::_itemForIncidentAtIndex_inLine(std::size_t index,
                                                                                     const TransitLineItemRef& line) {
  const TransitIncidents& incidents = line->incidents();
  const TransitIncident* incident = index < incidents.size() ? incidents[index].get() : nullptr;
  std::string title = IncidentStringProvider::cellTitleForIncident(incident);
  std::string text = IncidentStringProvider::cellSecondaryTextForIncident(incident);
  if (title.empty() && text.empty()) return nullptr;
  if (_lineParts.line != line) {
    auto shield = SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(shieldOfLine(*line), kRowShieldSize,
                                                                               _artworkCache);
    _lineParts = {line, NBConfiguredArtwork::initWithArtworkSource_alpha(std::move(shield), kFullArtworkAlpha),
                  _userActivityDataForLineItem(line)};
  }
  return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      std::move(title), std::move(text), _lineParts.artwork, false, _lineParts.userActivityData);
}

NBUserActivityDataRef NBTransitIncidentsDataSourceBuilder::_userActivityDataForLineItem(
    const TransitLineItemRef& line) const {
  return activityDataForLineItem(line);
}

NBTransitItemRef NBTransitIncidentsDataSourceBuilder::_allClearItem() const {
  return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      LocalizedString("TransitWidget_GoodService_Title"), _allClearSecondaryText(),
      artworkOfImageNamed("good-v2", kFullArtworkAlpha), false,
      std::make_shared<const NBURLOpenable>(_urlForFavorites()));
}

std::string NBTransitIncidentsDataSourceBuilder::_allClearSecondaryText() const {
  return textWithCount("TransitWidget_GoodService_SecondaryText", _lineItems.size());
}

NBTransitItemRef NBTransitIncidentsDataSourceBuilder::_clearServiceItemForLines(const TransitLineItems& lines) const {
  return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      LocalizedString("TransitWidget_GoodService_Title"), _clearServiceSecondaryTextForLines(lines),
      artworkOfImageNamed("good-alt-v2", kDimmedArtworkAlpha), false,
      std::make_shared<const NBURLOpenable>(_urlForFavorites()));
}

std::string NBTransitIncidentsDataSourceBuilder::_clearServiceSecondaryTextForLines(
    const TransitLineItems& lines) const {
  return textWithCount("TransitWidget_GoodService_Overflow_SecondaryText", lines.size());
}

URL NBTransitIncidentsDataSourceBuilder::_urlForFavorites() const {
  const URL url = MapURLBuilder::initForShowFavoritesType(kFavoritesTypeTransitLines, kMapTypeTransit).build();
  UserSession::prepareSharedSession();
  return UserSession::sharedSessionURLForPunchoutURL(url.absoluteString());
}

NBTransitItemRef NBTransitIncidentsDataSourceBuilder::_incidentsOverflowItemForIncidents_incidentsToLineMapping(
    const TransitIncidents& incidents, const TransitIncidentToLineMap& incidentsToLine) const {
  TransitLineItems lines;
  for (const TransitIncidentRef& incident : incidents) {
    const auto entry = incidentsToLine.find(incident);
    if (entry == incidentsToLine.end()) continue;
    if (std::find(lines.begin(), lines.end(), entry->second) == lines.end()) lines.push_back(entry->second);
  }
  return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      _advisoriesOverflowTitleForIncidentCount(incidents.size()),
      _advisoriesOverflowSecondaryTextForLineItemsCount(lines.size()),
      artworkOfImageNamed("advisories-v2", kDimmedArtworkAlpha), false, _activityDataForIncidents(incidents));
}

std::string NBTransitIncidentsDataSourceBuilder::_advisoriesOverflowTitleForIncidentCount(std::size_t count) const {
  return textWithCount("TransitWidget_advisory_overflow_title", count);
}

std::string NBTransitIncidentsDataSourceBuilder::_advisoriesOverflowSecondaryTextForLineItemsCount(
    std::size_t count) const {
  return textWithCount("TransitWidget_AdvisoriesOverflow_SecondaryText", count);
}

NBTransitSummaryItemRef NBTransitIncidentsDataSourceBuilder::_summaryItemForIncidents_items_itemToLinesMap(
    const TransitIncidents& incidents, const NBTransitItems& items, const ItemToLinesMap& itemToLines) const {
  TransitArtworks shields;
  const auto addShield = [&](const TransitLineItemRef& line) {
    TransitArtworkRef shield = shieldOfLine(*line);
    if (!shield) return;
    const auto isSame = [&](const TransitArtworkRef& other) {
      return artworksAreEquivalent(other.get(), shield.get());
    };
    // From the back: many rows in a row are often of the same lines.
    if (std::find(shields.rbegin(), shields.rend(), shield) == shields.rend() &&
        std::none_of(shields.begin(), shields.end(), isSame))
      shields.push_back(std::move(shield));
  };
  for (std::size_t row = 0; row < items.size(); ++row) {
    if (!itemToLines[row].first) continue;
    addShield(itemToLines[row].first);
    for (const TransitLineItemRef& line : itemToLines[row].others) addShield(line);
  }
  return NBTransitSummaryItem::initWithText_artworks_userActivityData(
      textWithCount("TransitWidget_Summary_advisory_count", incidents.size()), std::move(shields),
      _activityDataForIncidents(incidents));
}

NBUserActivityDataRef NBTransitIncidentsDataSourceBuilder::_activityDataForIncidents(
    const TransitIncidents& incidents) const {
  return activityDataForIncidents(incidents);
}

}  // namespace nimbo
