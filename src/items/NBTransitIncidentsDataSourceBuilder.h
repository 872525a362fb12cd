#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "analytics/NBTransitIncidentsAnalyticsDelegate.h"
#include "handoff/NBUserActivityData.h"
#include "items/NBTransitIncidentFilter.h"
#include "items/NBTransitItemDataSourceBuilder.h"
#include "items/NBTransitSummaryItem.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/foundation/URL.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// Makes the rows of the favourite lines: one for each incident in force, however many lines share it, one for the
/// lines without any, and the compact row that sums them up.
class NBTransitIncidentsDataSourceBuilder final : public NBTransitItemDataSourceBuilder {
 public:
  /// Expanded rows at most; 0 is no limit. `analytics` may be null.
  static std::shared_ptr<NBTransitIncidentsDataSourceBuilder> initWithLineItems_maxNumberOfItems_artworkCache_analytics(
      TransitLineItems lineItems, std::uint64_t maxNumberOfItems, std::shared_ptr<ArtworkCache> artworkCache,
      std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> analytics);
  NBTransitIncidentsDataSourceBuilder(TransitLineItems lineItems, std::uint64_t maxNumberOfItems,
                                      std::shared_ptr<ArtworkCache> artworkCache,
                                      std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> analytics);

  const NBTransitListItemRef& listItem() override;

  /// In the order of the favourites.
  const TransitLineItems& lineItems() const { return _lineItems; }
  /// All bits set where there is no limit.
  std::uint64_t maxNumberOfItems() const { return _maxNumberOfItems; }
  const std::shared_ptr<ArtworkCache>& artworkCache() const { return _artworkCache; }

  /// The default filter unless another was set. Never null.
  const std::shared_ptr<const NBTransitIncidentFilter>& incidentFilter();
  void setIncidentFilter(std::shared_ptr<const NBTransitIncidentFilter> filter) { _incidentFilter = std::move(filter); }

  /// Hears what was shown; may be null.
  const std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>& analytics() const { return _analytics; }
  void setAnalytics(std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> analytics) {
    _analytics = std::move(analytics);
  }

  std::string_view className() const override { return "NBTransitIncidentsDataSourceBuilder"; }

 private:
  /// The lines on which the incident of a row was found. Most rows have one: no list is made for them.
  struct RowLines {
    TransitLineItemRef first;  ///< made the row; null once the lines speak through another row
    TransitLineItems others;
    TransitLineItems all() const;
  };
  /// Those of row k at k.
  using ItemToLinesMap = std::vector<RowLines>;

  /// What a scan of the lines finds. Row k shows displayed incident k, whose number is displayed muid k.
  struct Scan {
    TransitIncidents displayedIncidents;
    std::vector<std::uint64_t> displayedMuids;
    NBTransitItems items;
    TransitIncidentToLineMap incidentsToLine;  ///< empty when nobody is going to ask
    ItemToLinesMap itemToLines;
    TransitLineItems clearLines;
  };

  /// The size at which rows show shields, the largest.
  static constexpr std::int64_t kRowShieldSize = 7;

  /// What all rows of one line share.
  struct LineParts {
    TransitLineItemRef line;
    NBConfiguredArtworkRef artwork;
    NBUserActivityDataRef userActivityData;
  };

  NBTransitListItemRef _buildTransitListItem();
  Scan scanLines();
  NBTransitListItemRef listItemForScan(const Scan& scan) const;
  void capExpandedItems(NBTransitItems& expandedItems, const Scan& scan) const;
  void reportToAnalytics(const Scan& scan) const;

  // The rows and their texts.
  NBTransitItemRef _noFavoritesItem() const;
  /// Null when the incident has no texts.
  NBTransitItemRef _itemForIncidentAtIndex_inLine(std::size_t index, const TransitLineItemRef& line);
  NBTransitItemRef _allClearItem() const;
  std::string _allClearSecondaryText() const;
  NBTransitItemRef _clearServiceItemForLines(const TransitLineItems& lines) const;
  std::string _clearServiceSecondaryTextForLines(const TransitLineItems& lines) const;
  NBTransitItemRef _incidentsOverflowItemForIncidents_incidentsToLineMapping(
      const TransitIncidents& incidents, const TransitIncidentToLineMap& incidentsToLine) const;
  std::string _advisoriesOverflowTitleForIncidentCount(std::size_t count) const;
  std::string _advisoriesOverflowSecondaryTextForLineItemsCount(std::size_t count) const;
  NBTransitSummaryItemRef _summaryItemForIncidents_items_itemToLinesMap(const TransitIncidents& incidents,
                                                                        const NBTransitItems& items,
                                                                        const ItemToLinesMap& itemToLines) const;

  // What the rows open.
  NBUserActivityDataRef _userActivityDataForLineItem(const TransitLineItemRef& line) const;
  NBUserActivityDataRef _activityDataForIncidents(const TransitIncidents& incidents) const;
  URL _urlForFavorites() const;

  // Rows of several lines.
  void _updateItemsAffectingSeveralLines_itemToLinesMap(NBTransitItems& items, ItemToLinesMap& itemToLines) const;
  NBTransitItemRef itemAffectingLines(const NBTransitItem& item, const TransitLineItems& lines) const;
  static std::optional<std::string> _prependLineNames_toText(const TransitLineItems& lines,
                                                             const std::optional<std::string>& text);

  NBTransitListItemRef _listItem;
  TransitLineItems _lineItems;
  std::uint64_t _maxNumberOfItems;
  std::shared_ptr<ArtworkCache> _artworkCache;
  std::shared_ptr<const NBTransitIncidentFilter> _incidentFilter;
  std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> _analytics;
  LineParts _lineParts;  // of the line whose rows are being made
};

}  // namespace nimbo
