#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <vector>

#include "handoff/NBOpenable.h"
#include "incidents/Result.h"
#include "items/NBTransitItem.h"
#include "items/NBTransitListItem.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/ui/TableView.h"
#include "ui/NBTransitItemArtworkColumnCalculator.h"
#include "ui/TransitDirectionsListArtworkWidthCalculator.h"

namespace nimbo {

class NBTransitIncidentDataSource;
class NBTransitIncidentsAnalyticsDelegate;

/// Hears of the table model's changes, on the main thread.
class NBTransitIncidentDataSourceDelegate {
 public:
  virtual ~NBTransitIncidentDataSourceDelegate() = default;
  /// What the table shows, or how tall it is, has changed.
  virtual void dataSourceDidUpdateContent(NBTransitIncidentDataSource& dataSource) = 0;
  /// The user tapped a row that can be opened.
  virtual void dataSource_didSelectOpenableItem_atIndexPath(NBTransitIncidentDataSource& dataSource,
                                                            const std::shared_ptr<const NBOpenable>& openable,
                                                            IndexPath indexPath) = 0;
};

/// The model behind the widget's table: turns a result of line items into rows, fits their shields into one column, and
/// answers the table view. Main thread only.
class NBTransitIncidentDataSource final : public Object, public TableViewDataSource, public TableViewDelegate {
 public:
  /// The result may be null: an empty success stands for it. The most rows an expanded list may have (0: any number);
  /// the width in points.
  static std::shared_ptr<NBTransitIncidentDataSource>
  initWithTransitLineItemsResult_expanded_artworkCache_maxNumberOfRows_availableWidth(
      ResultRef result, bool expanded, std::shared_ptr<ArtworkCache> artworkCache, std::uint64_t maxNumberOfRows,
      double availableWidth);

  /// Registers the cells and becomes the table view's data source and delegate.
  void configureTableView(TableView& tableView);

  /// Takes a new result; the very same object changes nothing. The analytics session may be null.
  void updateTransitLineItemResult_captureAnalytics(
      ResultRef result, const std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>& analytics);
  /// Builds the rows again from the same result, for the present moment. The analytics session may be null.
  void recalculateDataSourceItemsWithAnalytics(const std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>& analytics);

  const ResultRef& transitLineItemResult() const { return _transitLineItemResult; }

  const std::shared_ptr<const NBTransitListItem>& listItem() const { return _listItem; }
  /// An equal list item changes nothing.
  void setListItem(std::shared_ptr<const NBTransitListItem> listItem);

  bool isExpanded() const { return _expanded; }
  /// Refused, with a log line, while there are no expanded rows; the delegate is told all the same.
  void setExpanded(bool expanded);

  /// Points; 110 until set.
  double rowHeight() const { return _rowHeight; }
  std::uint64_t maxNumberOfRows() const { return _maxNumberOfRows; }
  void setRowHeight_maxNumberOfRows(double rowHeight, std::uint64_t maxNumberOfRows);

  /// Points.
  double availableWidth() const { return _availableWidth; }
  void setAvailableWidth(double availableWidth);

  /// Points.
  double artworkColumnWidth() const { return fitted()._artworkColumnWidth; }
  const std::shared_ptr<ArtworkCache>& artworkCache() const { return _artworkCache; }
  const std::shared_ptr<NBTransitItemArtworkColumnCalculator>& artworkColumnCalculator() const;

  /// The rows as shown: the list item's, with shields that fit the column.
  const std::optional<NBTransitItems>& shieldAdjustedExpandedItems() const {
    return fitted()._shieldAdjustedExpandedItems;
  }
  const ObjectRef& shieldAjustedSummaryItem() const { return fitted()._shieldAjustedSummaryItem; }

  std::shared_ptr<NBTransitIncidentDataSourceDelegate> delegate() const { return _delegate.lock(); }
  void setDelegate(std::weak_ptr<NBTransitIncidentDataSourceDelegate> delegate) { _delegate = std::move(delegate); }

  /// Points: the width given, and room for the rows of the current state.
  Size preferredContentSizeForExpanded_maxSize(bool expanded, Size maxSize) const;

  std::int64_t numberOfSectionsInTableView(TableView& tableView) override;
  std::int64_t tableView_numberOfRowsInSection(TableView& tableView, std::int64_t section) override;
  std::shared_ptr<StyledTableCell> tableView_cellForRowAtIndexPath(TableView& tableView, IndexPath indexPath) override;
  double tableView_estimatedHeightForRowAtIndexPath(TableView& tableView, IndexPath indexPath) override;
  void tableView_didSelectRowAtIndexPath(TableView& tableView, IndexPath indexPath) override;
  bool tableView_shouldHighlightRowAtIndexPath(TableView& tableView, IndexPath indexPath) override;

  /// The item shown at a row, or null.
  ObjectRef _itemAtIndexPath(IndexPath indexPath) const;
  /// What a tap on a row opens, or null.
  std::shared_ptr<const NBOpenable> _openableItemAtIndexPath(IndexPath indexPath) const;

  std::string_view className() const override { return "NBTransitIncidentDataSource"; }

 private:
  NBTransitIncidentDataSource(ResultRef result, std::shared_ptr<ArtworkCache> artworkCache,
                              std::uint64_t maxNumberOfRows, double availableWidth);

  static bool _sanatizedExpandedValue_forListItem(bool expanded, const NBTransitListItem& listItem);
  std::shared_ptr<const NBTransitListItem> buildListItem(
      const std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>& analytics) const;
  ArtworkWidthCalculatorSizeParameter _sizeParameters() const;
  void _updateAdjustedShieldItemsAndColumnWidth() const;
  /// This, with the shields fitted.
  const NBTransitIncidentDataSource& fitted() const {
    _updateAdjustedShieldItemsAndColumnWidth();
    return *this;
  }
  NBTransitItems itemsFittingColumn(const NBTransitItems& items) const;
  std::int64_t _numberOfRowInFirstSectionForExpandedState(bool expanded) const;
  void tellDelegate();

  double _rowHeight = 110.0;
  std::uint64_t _maxNumberOfRows;
  bool _expanded = false;
  // Fitted when first read: shields are drawn for it, which a host that wants texts alone never needs.
  mutable std::optional<NBTransitItems> _shieldAdjustedExpandedItems;
  mutable ObjectRef _shieldAjustedSummaryItem;
  mutable double _artworkColumnWidth = 0;
  mutable std::shared_ptr<NBTransitItemArtworkColumnCalculator> _artworkColumnCalculator;
  ResultRef _transitLineItemResult;
  double _availableWidth;
  std::shared_ptr<const NBTransitListItem> _listItem;
  std::shared_ptr<ArtworkCache> _artworkCache;
  std::weak_ptr<NBTransitIncidentDataSourceDelegate> _delegate;
};

}  // namespace nimbo
