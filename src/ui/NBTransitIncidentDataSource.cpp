#include "ui/NBTransitIncidentDataSource.h"

#include <algorithm>

#include "items/NBConfiguredArtwork.h"
#include "items/NBTransitItemDataSourceBuilder.h"
#include "items/NBTransitSummaryItem.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/foundation/Boxed.h"
#include "platform/foundation/Log.h"
#include "ui/NBTransitItemFixedHeightCell.h"
#include "ui/NBTransitSummaryCell.h"

namespace nimbo {

namespace {

constexpr const char* kItemCellIdentifier = "NBTransitItemFixedHeightCell";
constexpr const char* kSummaryCellIdentifier = "NBTransitSummaryCell";
constexpr const char* kEmptyCellIdentifier = "StyledTableCell";

constexpr double kDefaultArtworkViewWidth = 73.0;
/// What the texts of a row keep of the available width.
constexpr double kWidthBesideArtwork = 214.0;

bool itemsEqual(const NBTransitItems& a, const NBTransitItems& b) { return std::ranges::equal(a, b, absentOrEqual); }

}  // namespace

std::shared_ptr<NBTransitIncidentDataSource>
NBTransitIncidentDataSource::initWithTransitLineItemsResult_expanded_artworkCache_maxNumberOfRows_availableWidth(
    ResultRef result, bool expanded, std::shared_ptr<ArtworkCache> artworkCache, std::uint64_t maxNumberOfRows,
    double availableWidth) {
  if (!result) result = Result::resultWithValue(std::make_shared<const BoxedArray>(std::vector<ObjectRef>{}));
  const std::shared_ptr<NBTransitIncidentDataSource> dataSource(
      new NBTransitIncidentDataSource(std::move(result), std::move(artworkCache), maxNumberOfRows, availableWidth));
  dataSource->_listItem = dataSource->buildListItem(nullptr);
  dataSource->_expanded = _sanatizedExpandedValue_forListItem(expanded, *dataSource->_listItem);
  return dataSource;
}

NBTransitIncidentDataSource::NBTransitIncidentDataSource(ResultRef result, std::shared_ptr<ArtworkCache> artworkCache,
                                                         std::uint64_t maxNumberOfRows, double availableWidth)
    : _maxNumberOfRows(maxNumberOfRows),
      _transitLineItemResult(std::move(result)),
      _availableWidth(availableWidth),
      _artworkCache(std::move(artworkCache)) {}

void NBTransitIncidentDataSource::configureTableView(TableView& tableView) {
  tableView.registerClass_forCellReuseIdentifier(&NBTransitItemFixedHeightCell::initWithStyle_reuseIdentifier,
                                                 kItemCellIdentifier);
  tableView.registerClass_forCellReuseIdentifier(&NBTransitSummaryCell::initWithStyle_reuseIdentifier,
                                                 kSummaryCellIdentifier);
  tableView.setTableFooterView(std::make_shared<View>());
  const auto self = std::static_pointer_cast<NBTransitIncidentDataSource>(shared_from_this());
  tableView.setDelegate(std::weak_ptr<TableViewDelegate>(self));
  tableView.setDataSource(std::weak_ptr<TableViewDataSource>(self));
}

void NBTransitIncidentDataSource::updateTransitLineItemResult_captureAnalytics(
    ResultRef result, const std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>& analytics) {
  if (result == _transitLineItemResult) return;
  _transitLineItemResult = std::move(result);
  recalculateDataSourceItemsWithAnalytics(analytics);
}

void NBTransitIncidentDataSource::recalculateDataSourceItemsWithAnalytics(
    const std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>& analytics) {
  setListItem(buildListItem(analytics));
}

std::shared_ptr<const NBTransitListItem> NBTransitIncidentDataSource::buildListItem(
    const std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>& analytics) const {
  return NBTransitDataSourceBuilderForResult(_transitLineItemResult, _maxNumberOfRows, _artworkCache, analytics)
      ->listItem();
}

void NBTransitIncidentDataSource::setListItem(std::shared_ptr<const NBTransitListItem> listItem) {
  if (absentOrEqual(listItem, _listItem)) return;
  _listItem = std::move(listItem);
  _shieldAdjustedExpandedItems.reset();
  _shieldAjustedSummaryItem = nullptr;
  tellDelegate();
}

void NBTransitIncidentDataSource::setRowHeight_maxNumberOfRows(double rowHeight, std::uint64_t maxNumberOfRows) {
  const bool limitChanged = maxNumberOfRows != _maxNumberOfRows;
  if (rowHeight == _rowHeight && !limitChanged) return;
  _rowHeight = rowHeight;
  _maxNumberOfRows = maxNumberOfRows;
  if (limitChanged)
    recalculateDataSourceItemsWithAnalytics(nullptr);
  else
    tellDelegate();
}

void NBTransitIncidentDataSource::setExpanded(bool expanded) {
  if (expanded == _expanded) return;
  _expanded = _sanatizedExpandedValue_forListItem(expanded, *_listItem);
  tellDelegate();
}

bool NBTransitIncidentDataSource::_sanatizedExpandedValue_forListItem(bool expanded,
                                                                      const NBTransitListItem& listItem) {
  if (!expanded || listItem.hasExpandedItems()) return expanded;
  writeLog(NBTransitWidgetLogFacility, LogLevel::error,
           "Trying to set expanded state on widget datasource without expanded items to show, ignoring request to "
           "expand datasource state.\nListItem: %@",
           {listItem.description()});
  return false;
}

void NBTransitIncidentDataSource::setAvailableWidth(double availableWidth) {
  if (availableWidth == _availableWidth) return;
  _updateAdjustedShieldItemsAndColumnWidth();
  _availableWidth = availableWidth;
  const ObjectRef oldSummaryItem = std::exchange(_shieldAjustedSummaryItem, nullptr);
  const auto oldExpandedItems = std::exchange(_shieldAdjustedExpandedItems, std::nullopt);
  const double oldColumnWidth = _artworkColumnWidth;
  _updateAdjustedShieldItemsAndColumnWidth();
  const bool expandedUnchanged = !_expanded || itemsEqual(oldExpandedItems.value_or(NBTransitItems{}),
                                                          _shieldAdjustedExpandedItems.value_or(NBTransitItems{}));
  const bool summaryUnchanged = oldSummaryItem && oldSummaryItem->isEqual(_shieldAjustedSummaryItem.get());
  if (_artworkColumnWidth == oldColumnWidth && expandedUnchanged && summaryUnchanged) return;
  tellDelegate();
}

const std::shared_ptr<NBTransitItemArtworkColumnCalculator>& NBTransitIncidentDataSource::artworkColumnCalculator()
    const {
  if (!_artworkColumnCalculator) _artworkColumnCalculator = std::make_shared<NBTransitItemArtworkColumnCalculator>();
  return _artworkColumnCalculator;
}

ArtworkWidthCalculatorSizeParameter NBTransitIncidentDataSource::_sizeParameters() const {
  return {.defaultArtworkViewWidth = kDefaultArtworkViewWidth,
          .maxArtworkViewWidth = std::max(_availableWidth - kWidthBesideArtwork, kDefaultArtworkViewWidth),
          .artworkInsets = {}};
}

NBTransitItems NBTransitIncidentDataSource::itemsFittingColumn(const NBTransitItems& items) const {
  return artworkColumnCalculator()->itemsFromItems_sizeParameter_outArtworkColumnWidth_downSizingBlock(
      items, _sizeParameters(), &_artworkColumnWidth,
      [](const std::shared_ptr<const NBTransitItem>& item, const std::shared_ptr<const SizedTransitArtwork>& artwork) {
        return item->copyWithSecondaryText_artwork(
            item->secondaryText(), NBConfiguredArtwork::initWithArtworkSource_alpha(artwork, item->artwork()->alpha()));
      });
}

void NBTransitIncidentDataSource::_updateAdjustedShieldItemsAndColumnWidth() const {
  if (!_shieldAdjustedExpandedItems)
    _shieldAdjustedExpandedItems = itemsFittingColumn(_listItem->expandedItemsOrEmpty());
  if (_shieldAjustedSummaryItem) return;
  _shieldAjustedSummaryItem = _listItem->summaryItem();
  // After the expanded rows: the column ends as wide as the summary row needs it.
  if (const auto item = std::dynamic_pointer_cast<const NBTransitItem>(_shieldAjustedSummaryItem))
    _shieldAjustedSummaryItem = itemsFittingColumn({item}).front();
}

std::int64_t NBTransitIncidentDataSource::_numberOfRowInFirstSectionForExpandedState(bool expanded) const {
  if (!expanded) return _listItem->summaryItem() ? 1 : 0;
  return static_cast<std::int64_t>(_listItem->expandedItemsOrEmpty().size());
}

Size NBTransitIncidentDataSource::preferredContentSizeForExpanded_maxSize(bool /*expanded*/, Size maxSize) const {
  return {maxSize.width, _rowHeight * static_cast<double>(_numberOfRowInFirstSectionForExpandedState(_expanded))};
}

ObjectRef NBTransitIncidentDataSource::_itemAtIndexPath(IndexPath indexPath) const {
  if (indexPath.section != 0) return nullptr;
  if (!_expanded) return shieldAjustedSummaryItem();
  if (indexPath.row < 0 || indexPath.row >= _numberOfRowInFirstSectionForExpandedState(true)) return nullptr;
  return (*shieldAdjustedExpandedItems())[static_cast<std::size_t>(indexPath.row)];
}

std::shared_ptr<const NBOpenable> NBTransitIncidentDataSource::_openableItemAtIndexPath(IndexPath indexPath) const {
  const ObjectRef item = _itemAtIndexPath(indexPath);
  if (const auto* row = dynamic_cast<const NBTransitItem*>(item.get())) return row->openable();
  if (const auto* summary = dynamic_cast<const NBTransitSummaryItem*>(item.get())) return summary->userActivityData();
  return nullptr;
}

std::int64_t NBTransitIncidentDataSource::numberOfSectionsInTableView(TableView&) { return 1; }

std::int64_t NBTransitIncidentDataSource::tableView_numberOfRowsInSection(TableView&, std::int64_t) {
  return _numberOfRowInFirstSectionForExpandedState(_expanded);
}

std::shared_ptr<StyledTableCell> NBTransitIncidentDataSource::tableView_cellForRowAtIndexPath(TableView& tableView,
                                                                                              IndexPath indexPath) {
  const ObjectRef item = _itemAtIndexPath(indexPath);
  std::shared_ptr<StyledTableCell> cell;
  if (auto transitItem = std::dynamic_pointer_cast<const NBTransitItem>(item)) {
    const auto itemCell = std::static_pointer_cast<NBTransitItemFixedHeightCell>(
        tableView.dequeueReusableCellWithIdentifier_forIndexPath(kItemCellIdentifier, indexPath));
    itemCell->setTransitItem(std::move(transitItem));
    itemCell->setTrailingArtworkColumnWidth(artworkColumnWidth());
    itemCell->setRowHeight(_rowHeight);
    cell = itemCell;
  } else if (auto summaryItem = std::dynamic_pointer_cast<const NBTransitSummaryItem>(item)) {
    const auto summaryCell = std::static_pointer_cast<NBTransitSummaryCell>(
        tableView.dequeueReusableCellWithIdentifier_forIndexPath(kSummaryCellIdentifier, indexPath));
    summaryCell->setArtworkCache(_artworkCache);
    summaryCell->setItem(std::move(summaryItem));
    summaryCell->setRowHeight(_rowHeight);
    cell = summaryCell;
  } else {
    cell = std::make_shared<StyledTableCell>(TableCellStyle::standard, kEmptyCellIdentifier);
  }
  const bool isLast = indexPath.row == tableView_numberOfRowsInSection(tableView, indexPath.section) - 1;
  cell->setSeparatorStyleOverride(isLast ? 0 : 1);
  return cell;
}

double NBTransitIncidentDataSource::tableView_estimatedHeightForRowAtIndexPath(TableView&, IndexPath) { return 5.0; }

void NBTransitIncidentDataSource::tableView_didSelectRowAtIndexPath(TableView& tableView, IndexPath indexPath) {
  tableView.deselectRowAtIndexPath_animated(indexPath, true);
  const auto openable = _openableItemAtIndexPath(indexPath);
  const auto delegate = _delegate.lock();
  if (openable && delegate) delegate->dataSource_didSelectOpenableItem_atIndexPath(*this, openable, indexPath);
}

bool NBTransitIncidentDataSource::tableView_shouldHighlightRowAtIndexPath(TableView&, IndexPath indexPath) {
  return _openableItemAtIndexPath(indexPath) != nullptr;
}

void NBTransitIncidentDataSource::tellDelegate() {
  if (const auto delegate = _delegate.lock()) delegate->dataSourceDidUpdateContent(*this);
}

}  // namespace nimbo
