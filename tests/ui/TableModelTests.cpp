#include <algorithm>

#include "analytics/NBTransitIncidentsAnalyticsDelegate.h"
#include "handoff/NBOpenable.h"
#include "items/NBConfiguredArtwork.h"
#include "items/NBTransitSummaryItem.h"
#include "platform/artwork/ArtworkCache.h"
#include "support/TestPlatform.h"
#include "ui/ArtworkCache+Nimbo.h"
#include "ui/NBTransitIncidentDataSource.h"
#include "ui/NBTransitItemFixedHeightCell.h"
#include "ui/NBTransitSummaryCell.h"

namespace nimbo {
namespace {

using testing::ElementsAre;

ResultRef success(const TransitLineItems& items) { return Result::resultWithValue(BoxedArray::of(items)); }

struct RecordingDelegate final : NBTransitIncidentDataSourceDelegate {
  void dataSourceDidUpdateContent(NBTransitIncidentDataSource&) override { ++updates; }
  void dataSource_didSelectOpenableItem_atIndexPath(NBTransitIncidentDataSource&,
                                                    const std::shared_ptr<const NBOpenable>& openable,
                                                    IndexPath indexPath) override {
    opened.push_back(openable);
    openedRow = indexPath.row;
    EXPECT_EQ(table->highlightedRow(), std::nullopt) << "deselected at once";
  }
  int updates = 0;
  std::vector<std::shared_ptr<const NBOpenable>> opened;
  std::int64_t openedRow = -1;
  std::shared_ptr<TableView> table;
};

class TableModel : public testing::Test {
 protected:
  void make(const ResultRef& result, std::uint64_t limit = 0, double width = 359, bool expanded = false) {
    model = NBTransitIncidentDataSource::
        initWithTransitLineItemsResult_expanded_artworkCache_maxNumberOfRows_availableWidth(result, expanded, cache,
                                                                                            limit, width);
    table = TableView::initWithFrame_style({0, 0, width, 110}, TableViewStyle::plain);
    model->configureTableView(*table);
    delegate->table = table;
    model->setDelegate(delegate);
  }
  std::vector<std::string> cells() {
    table->reloadData();
    std::vector<std::string> names;
    for (std::int64_t row = 0; row < table->numberOfRows(); ++row)
      names.emplace_back(table->cellForRowAtIndexPath({0, row})->className());
    return names;
  }
  int updatesAfter(const std::function<void()>& change) {
    const int before = delegate->updates;
    change();
    return delegate->updates - before;
  }
  /// A row that shows a shield with its name.
  NBTransitItemRef row(const std::string& name, std::int64_t shieldSize = 7, double alpha = 1, bool hidden = false) {
    return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
        "Title of " + name, "Text of " + name,
        NBConfiguredArtwork::initWithArtworkSource_alpha(
            SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(shieldArtwork(name), shieldSize, cache),
            alpha),
        hidden, std::make_shared<const NBURLOpenable>(URL("nimbo://" + name)));
  }

  TestPlatform platform;
  std::shared_ptr<ArtworkCache> cache = memoryConstrainedImageViewCache();
  std::shared_ptr<RecordingDelegate> delegate = std::make_shared<RecordingDelegate>();
  std::shared_ptr<NBTransitIncidentDataSource> model;
  std::shared_ptr<TableView> table;
};

const TransitLineItems kTwoIncidents = {lineItem(1, "1", {incident(10), incident(11)}), lineItem(2, "2")};
const std::string kRow = "NBTransitItemFixedHeightCell", kSummary = "NBTransitSummaryCell";

NBTransitListItemRef list(ObjectRef summary, NBTransitItems expanded) {
  return NBTransitListItem::initWithSummaryItem_expandedItems(std::move(summary), std::move(expanded));
}

TEST_F(TableModel, ShowsOneCompactRowOrAllExpandedOnes) {
  platform.shieldRenderer->width = [](std::int64_t, const std::string&) { return 100.0; };
  make(success(kTwoIncidents));
  EXPECT_EQ(model->rowHeight(), 110.0);
  EXPECT_THAT(table->subviews(), testing::SizeIs(1)) << "an empty footer";
  EXPECT_THAT(cells(), ElementsAre(kSummary));
  const auto& summary = dynamic_cast<const NBTransitSummaryCell&>(*table->cellForRowAtIndexPath({0, 0}));
  EXPECT_EQ(summary.separatorStyleOverride(), 0);
  EXPECT_EQ(summary.item(), model->listItem()->summaryItem());
  EXPECT_EQ(summary.artworkCache(), cache);
  EXPECT_EQ(model->preferredContentSizeForExpanded_maxSize(false, {320, 110}), (Size{320, 110}));
  EXPECT_EQ(model->tableView_estimatedHeightForRowAtIndexPath(*table, {0, 0}), 5);
  EXPECT_EQ(delegate->updates, 0);

  EXPECT_EQ(updatesAfter([&] { model->setExpanded(true); }), 1);
  model->setRowHeight_maxNumberOfRows(55, 0);
  EXPECT_THAT(cells(), ElementsAre(kRow, kRow, kRow));
  for (const auto& [index, separator] : {std::pair{0, 1}, {1, 1}, {2, 0}}) {
    const auto& cell = dynamic_cast<const NBTransitItemFixedHeightCell&>(*table->cellForRowAtIndexPath({0, index}));
    EXPECT_EQ(cell.separatorStyleOverride(), separator) << index;
    EXPECT_EQ(cell.transitItem(), model->_itemAtIndexPath({0, index}));
    EXPECT_EQ(cell.trailingArtworkColumnWidth(), 100);
    EXPECT_EQ(cell.rowHeight(), 55);
  }
  EXPECT_EQ(model->preferredContentSizeForExpanded_maxSize(true, {320, 110}), (Size{320, 165}));
  EXPECT_EQ(updatesAfter([&] { model->setExpanded(true); }), 0);
  EXPECT_EQ(updatesAfter([&] { model->setExpanded(false); }), 1);
  EXPECT_THAT(cells(), ElementsAre(kSummary));
  EXPECT_EQ(dynamic_cast<const NBTransitSummaryCell&>(*table->cellForRowAtIndexPath({0, 0})).rowHeight(), 55);
}

TEST_F(TableModel, RefusesToExpandWithoutExpandedRows) {
  make(nullptr, 0, 359, true);
  EXPECT_FALSE(model->isExpanded()) << "from the start";
  model->setExpanded(true);
  EXPECT_FALSE(model->isExpanded());
  EXPECT_EQ(delegate->updates, 1);
  const std::string complaint =
      "Trying to set expanded state on widget datasource without expanded items to show, ignoring request to expand "
      "datasource state.\nListItem: " +
      model->listItem()->description();
  EXPECT_THAT(platform.log.texts("TransitWidget", LogLevel::error), ElementsAre(complaint, complaint));
  model->setExpanded(false);
  EXPECT_EQ(delegate->updates, 1);
}

TEST_F(TableModel, ShowsNothingOfRowsThatAreNotThere) {
  make(success(kTwoIncidents), 0, 359, true);
  EXPECT_TRUE(model->isExpanded()) << "from the start";
  for (const IndexPath path : {IndexPath{0, 3}, {0, -1}, {1, 0}}) {
    EXPECT_EQ(model->_itemAtIndexPath(path), nullptr);
    EXPECT_FALSE(model->tableView_shouldHighlightRowAtIndexPath(*table, path));
    const auto cell = model->tableView_cellForRowAtIndexPath(*table, path);
    EXPECT_EQ(cell->className(), "StyledTableCell");
    EXPECT_EQ(cell->reuseIdentifier(), "StyledTableCell");
    EXPECT_EQ(cell->separatorStyleOverride(), 1);
  }
  EXPECT_NE(model->_itemAtIndexPath({0, 2}), nullptr);
  model->setListItem(list(nullptr, {}));
  EXPECT_TRUE(model->isExpanded()) << "until the host changes the mode";
  EXPECT_THAT(cells(), testing::IsEmpty());
  model->setExpanded(false);
  EXPECT_THAT(cells(), testing::IsEmpty());
  EXPECT_EQ(model->preferredContentSizeForExpanded_maxSize(false, {320, 110}), (Size{320, 0}));
}

TEST_F(TableModel, TellsItsDelegateOnlyOfWhatShowsAndTheSessionOfNewResults) {
  const auto session = NBTransitIncidentsAnalyticsDelegate::initWithTransitIncidentsViewController({});
  const ResultRef result = success(kTwoIncidents), oneLess = success({lineItem(1, "1", {incident(10)})});
  // The same content in new objects.
  const ResultRef equal = success({lineItem(1, "1", {incident(10), incident(11)}), lineItem(2, "2")});
  const auto update = [&](const ResultRef& to) {
    return [&, to] { model->updateTransitLineItemResult_captureAnalytics(to, session); };
  };
  const struct {
    const char* name;
    std::function<void()> change;
    int updates;
    std::size_t recordedIncidents;
  } cases[] = {
      {"same object", update(result), 0, 0},
      {"equal result", update(equal), 0, 2},
      {"rebuilt", [&] { model->recalculateDataSourceItemsWithAnalytics(session); }, 0, 2},
      {"other rows", update(oneLess), 1, 1},
      {"old rows", update(result), 1, 2},
      {"row height", [&] { model->setRowHeight_maxNumberOfRows(55, 0); }, 1, 0},
      {"same height", [&] { model->setRowHeight_maxNumberOfRows(55, 0); }, 0, 0},
      {"a limit that changes no row", [&] { model->setRowHeight_maxNumberOfRows(60, 7); }, 0, 0},
      {"a limit alone that changes rows", [&] { model->setRowHeight_maxNumberOfRows(60, 2); }, 1, 0},
      {"the same width", [&] { model->setAvailableWidth(359); }, 0, 0},
      {"a width that changes no shield", [&] { model->setAvailableWidth(400); }, 0, 0},
  };
  make(result, 0, 359, true);
  for (const auto& c : cases) {
    SCOPED_TRACE(c.name);
    session->startSessionIfNeeded();
    EXPECT_EQ(updatesAfter(c.change), c.updates);
    session->recordCloseSessionSwiping();
    EXPECT_EQ(platform.analytics.interactions.back().record.incidentItems.size(), c.recordedIncidents);
  }
  EXPECT_THAT(cells(), ElementsAre(kRow, kRow));
}

TEST_F(TableModel, ShrinksShieldsIntoTheColumnAndTellsItsDelegateOfWhatShows) {
  // The texts keep 214 points, the column has at least 73.
  platform.shieldRenderer->width = [](std::int64_t size, const std::string& name) {
    constexpr double kWidths[] = {72, 72.5, 73, 73.5, 145, 145.5, 186, 186.5};
    return name == "wide" ? kWidths[size] : 50;
  };
  const auto wide = [&](std::int64_t size) { return row("wide", size, 0.5, true); };
  const NBTransitItemRef slim = row("slim");
  const NBTransitItems rows{wide(7), slim};
  const auto several = NBTransitSummaryItem::initWithText_artworks_userActivityData("2", {}, nullptr);
  const struct {
    ObjectRef summary;
    NBTransitItems expanded;
    bool isExpanded;
    double width;
    std::int64_t wideShieldSize;
    double column;
    int updates;
  } cases[] = {
      {wide(7), {}, false, 400, 6, 186, 1},     {wide(7), {}, false, 200, 2, 73, 1},
      {wide(7), rows, true, 359.4, 4, 145, 0},  {several, rows, false, 400, 6, 186, 1},
      {slim, rows, true, 300, 3, 73, 1},         // beside the column of the summary, which holds for all rows
      {slim, rows, false, 300, 3, 73, 0},        // the same, out of sight
      {nullptr, rows, false, 359.4, 4, 145, 1},  // nothing to compare with
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(std::to_string(&c - cases));
    make(nullptr);
    model->setListItem(list(c.summary, c.expanded));
    model->setExpanded(c.isExpanded);
    EXPECT_EQ(updatesAfter([&] { model->setAvailableWidth(c.width); }), c.updates);
    EXPECT_EQ(model->artworkColumnWidth(), c.column);
    const NBTransitItems shrunk{wide(c.wideShieldSize), slim};
    EXPECT_TRUE(std::ranges::equal(*model->shieldAdjustedExpandedItems(), c.expanded.empty() ? c.expanded : shrunk,
                                   absentOrEqual));
    const bool isWide = absentOrEqual(c.summary, rows[0]);
    EXPECT_TRUE(absentOrEqual(model->shieldAjustedSummaryItem(), isWide ? ObjectRef(shrunk[0]) : c.summary));
  }
}

TEST_F(TableModel, OpensOnlyRowsThatHaveSomethingToOpen) {
  make(success({lineItem(1, "1")}));  // the all-clear row opens the favourites
  EXPECT_FALSE(model->tableView_shouldHighlightRowAtIndexPath(*table, {1, 0}));
  EXPECT_TRUE(table->selectRowAtIndexPath({0, 0}));
  ASSERT_EQ(delegate->opened.size(), 1u);
  EXPECT_NE(dynamic_cast<const NBURLOpenable*>(delegate->opened[0].get()), nullptr);

  make(success(kTwoIncidents));
  EXPECT_TRUE(table->selectRowAtIndexPath({0, 0}));
  EXPECT_EQ(delegate->opened.back(),
            dynamic_cast<const NBTransitSummaryItem&>(*model->listItem()->summaryItem()).userActivityData());
  model->setExpanded(true);
  table->reloadData();
  EXPECT_TRUE(table->selectRowAtIndexPath({0, 1}));
  EXPECT_EQ(delegate->openedRow, 1);
  EXPECT_EQ(delegate->opened.size(), 3u);

  make(Result::resultWithError(Error::errorWithDomain_code_reason("D", 1, "no")));
  EXPECT_FALSE(table->selectRowAtIndexPath({0, 0}));
  model->tableView_didSelectRowAtIndexPath(*table, {0, 0});
  EXPECT_EQ(delegate->opened.size(), 3u);
  make(success({lineItem(1, "1")}));
  delegate = nullptr;
  EXPECT_TRUE(table->selectRowAtIndexPath({0, 0})) << "nobody hears";
}

}  // namespace
}  // namespace nimbo
