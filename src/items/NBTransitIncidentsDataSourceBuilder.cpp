#include "items/NBTransitIncidentsDataSourceBuilder.h"

#include <algorithm>
#include <limits>

namespace nimbo {

std::shared_ptr<NBTransitIncidentsDataSourceBuilder>
NBTransitIncidentsDataSourceBuilder::initWithLineItems_maxNumberOfItems_artworkCache_analytics(
    TransitLineItems lineItems, std::uint64_t maxNumberOfItems, std::shared_ptr<ArtworkCache> artworkCache,
    std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> analytics) {
  return std::make_shared<NBTransitIncidentsDataSourceBuilder>(std::move(lineItems), maxNumberOfItems,
                                                               std::move(artworkCache), std::move(analytics));
}

NBTransitIncidentsDataSourceBuilder::NBTransitIncidentsDataSourceBuilder(
    TransitLineItems lineItems, std::uint64_t maxNumberOfItems, std::shared_ptr<ArtworkCache> artworkCache,
    std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> analytics)
    : _lineItems(std::move(lineItems)),
      _maxNumberOfItems(maxNumberOfItems ? maxNumberOfItems : std::numeric_limits<std::uint64_t>::max()),
      _artworkCache(std::move(artworkCache)),
      _analytics(std::move(analytics)) {}

const std::shared_ptr<const NBTransitIncidentFilter>& NBTransitIncidentsDataSourceBuilder::incidentFilter() {
  if (!_incidentFilter) _incidentFilter = std::make_shared<const NBTransitIncidentFilter>();
  return _incidentFilter;
}

const NBTransitListItemRef& NBTransitIncidentsDataSourceBuilder::listItem() {
  if (!_listItem) _listItem = _buildTransitListItem();
  return _listItem;
}

NBTransitListItemRef NBTransitIncidentsDataSourceBuilder::_buildTransitListItem() {
  Scan scan = scanLines();
  _updateItemsAffectingSeveralLines_itemToLinesMap(scan.items, scan.itemToLines);
  reportToAnalytics(scan);
  return listItemForScan(scan);
}

NBTransitIncidentsDataSourceBuilder::Scan NBTransitIncidentsDataSourceBuilder::scanLines() {
  const NBTransitIncidentFilter& filter = *incidentFilter();
  Scan scan;
  std::size_t incidentCount = 0;
  for (const TransitLineItemRef& line : _lineItems) incidentCount += line->incidents().size();
  const bool needsIncidentsToLine = _analytics || incidentCount >= _maxNumberOfItems;
  if (needsIncidentsToLine) scan.incidentsToLine.reserve(incidentCount);
  for (const TransitLineItemRef& line : _lineItems) {
    bool lineHasRow = false;
    const TransitIncidents& incidents = line->incidents();
    for (std::size_t index = 0; index < incidents.size(); ++index) {
      const TransitIncidentRef& incident = incidents[index];
      if (!filter.shouldDisplayIncident(*incident)) continue;
      const auto displayed = std::find(scan.displayedMuids.begin(), scan.displayedMuids.end(), incident->muid());
      if (displayed != scan.displayedMuids.end()) {
        const auto row = static_cast<std::size_t>(displayed - scan.displayedMuids.begin());
        scan.itemToLines[row].others.push_back(line);
        lineHasRow = true;
        continue;
      }
      NBTransitItemRef item = _itemForIncidentAtIndex_inLine(index, line);
      if (!item) continue;
      scan.displayedIncidents.push_back(incident);
      scan.displayedMuids.push_back(incident->muid());
      scan.items.push_back(std::move(item));
      if (needsIncidentsToLine) scan.incidentsToLine.emplace(incident, line);
      scan.itemToLines.push_back({line, {}});
      lineHasRow = true;
    }
    if (!lineHasRow) scan.clearLines.push_back(line);
  }
  return scan;
}

void NBTransitIncidentsDataSourceBuilder::reportToAnalytics(const Scan& scan) const {
  if (!_analytics) return;
  _analytics->recordInfoForLines_incidentDisplayed_incidentsToLineMapping(_lineItems, scan.displayedIncidents,
                                                                          scan.incidentsToLine);
}

NBTransitListItemRef NBTransitIncidentsDataSourceBuilder::listItemForScan(const Scan& scan) const {
  if (_lineItems.empty())
    return NBTransitListItem::initWithSummaryItem_expandedItems(_noFavoritesItem(), NBTransitItems{});
  if (scan.items.empty())
    return NBTransitListItem::initWithSummaryItem_expandedItems(_allClearItem(), NBTransitItems{});

  const bool isSingle = scan.items.size() == 1;
  NBTransitItems expandedItems;
  if (!isSingle || !scan.clearLines.empty()) expandedItems = scan.items;
  if (!scan.clearLines.empty()) expandedItems.push_back(_clearServiceItemForLines(scan.clearLines));
  if (isSingle)
    return NBTransitListItem::initWithSummaryItem_expandedItems(scan.items.front(), std::move(expandedItems));

  if (expandedItems.size() > _maxNumberOfItems) capExpandedItems(expandedItems, scan);
  return NBTransitListItem::initWithSummaryItem_expandedItems(
      _summaryItemForIncidents_items_itemToLinesMap(scan.displayedIncidents, scan.items, scan.itemToLines),
      std::move(expandedItems));
}

void NBTransitIncidentsDataSourceBuilder::capExpandedItems(NBTransitItems& expandedItems, const Scan& scan) const {
  // One of the places goes to the overflow row; with two or more, one goes to the clear-service row, which stays last.
  const auto places = static_cast<std::ptrdiff_t>(_maxNumberOfItems - 1);
  const bool hasClearRow = !scan.clearLines.empty();
  const bool keepsClearRow = hasClearRow && places > 0;
  const std::ptrdiff_t kept = places - (keepsClearRow ? 1 : 0);
  const TransitIncidents overflowed(scan.displayedIncidents.begin() + kept, scan.displayedIncidents.end());

  const auto first = expandedItems.begin() + kept;
  const auto last = expandedItems.end() - (keepsClearRow ? 1 : 0);
  const auto place = expandedItems.erase(first, last);
  expandedItems.insert(place,
                       _incidentsOverflowItemForIncidents_incidentsToLineMapping(overflowed, scan.incidentsToLine));
}

}  // namespace nimbo
