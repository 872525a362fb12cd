#include <gmock/gmock.h>

#include "handoff/URL+NBOpenable.h"
#include "items/NBConfiguredArtwork.h"
#include "items/NBTransitSummaryItem.h"
#include "platform/artwork/SizedTransitArtwork.h"
#include "support/TestPlatform.h"
#include "support/TransitFixtures.h"
#include "ui/ArtworkCache+Nimbo.h"
#include "ui/NBTransitIncidentDataSource.h"
#include "ui/NBTransitItemFixedHeightCell.h"
#include "ui/NBTransitSummaryCell.h"

namespace nimbo {
namespace {

using testing::ElementsAre;

ResultRef success(const TransitLineItems& items) { return Result::resultWithValue(BoxedArray::of(items)); }

class RecordingDelegate final : public NBTransitIncidentDataSourceDelegate {
 public:
  void dataSourceDidUpdateContent(NBTransitIncidentDataSource&) override { ++updates; }
  void dataSource_didSelectOpenableItem_atIndexPath(NBTransitIncidentDataSource&,
                                                    const std::shared_ptr<const NBOpenable>& openable,
                                                    IndexPath indexPath) override {
    opened.push_back(openable);
    openedRow = indexPath.row;
  }
  int updates = 0;
  std::vector<std::shared_ptr<const NBOpenable>> opened;
  std::int64_t openedRow = -1;
};

class TableModel : public testing::Test {
 protected:
  void make(const ResultRef& result, std::uint64_t limit = 0, double width = 359) {
    model = NBTransitIncidentDataSource::
        initWithTransitLineItemsResult_expanded_artworkCache_maxNumberOfRows_availableWidth(
            result, false, memoryConstrainedImageViewCache(), limit, width);
    table = TableView::initWithFrame_style({0, 0, width, 110}, TableViewStyle::plain);
    model->configureTableView(*table);
    model->setDelegate(delegate);
  }
  std::vector<std::string> cells() {
    table->reloadData();
    std::vector<std::string> names;
    for (std::int64_t row = 0; row < table->numberOfRows(); ++row)
      names.emplace_back(table->cellForRowAtIndexPath({0, row})->className());
    return names;
  }

  TestPlatform platform;
  std::shared_ptr<RecordingDelegate> delegate = std::make_shared<RecordingDelegate>();
  std::shared_ptr<NBTransitIncidentDataSource> model;
  std::shared_ptr<TableView> table;
};

const TransitLineItems kTwoIncidents = {lineItem(1, "1", {incident(10), incident(11)}), lineItem(2, "2")};

TEST_F(TableModel, ShowsOneCompactRowOrAllExpandedOnes) {
  make(success(kTwoIncidents));
  EXPECT_EQ(model->rowHeight(), 110.0);
  EXPECT_THAT(cells(), ElementsAre("NBTransitSummaryCell"));
  EXPECT_EQ(table->cellForRowAtIndexPath({0, 0})->separatorStyleOverride(), 0);

  model->setExpanded(true);
  const std::string row = "NBTransitItemFixedHeightCell";
  EXPECT_THAT(cells(), ElementsAre(row, row, row));
  for (const auto& [index, separator] : {std::pair{0, 1}, {1, 1}, {2, 0}})
    EXPECT_EQ(table->cellForRowAtIndexPath({0, index})->separatorStyleOverride(), separator) << index;
  EXPECT_EQ(model->preferredContentSizeForExpanded_maxSize(true, {320, 110}), (Size{320, 330}));
}

TEST_F(TableModel, RefusesToExpandWithoutExpandedRows) {
  make(nullptr);
  model->setExpanded(true);
  EXPECT_FALSE(model->isExpanded());
  EXPECT_EQ(delegate->updates, 1);
  EXPECT_TRUE(platform.log.contains("ignoring request to expand"));
  model->setExpanded(false);
  EXPECT_EQ(delegate->updates, 1);
}

TEST_F(TableModel, TellsItsDelegateOnlyOfWhatShows) {
  const ResultRef result = success(kTwoIncidents);
  make(result);
  const auto analytics = std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>();
  const auto updatesAfter = [&](const std::function<void()>& change) {
    const int before = delegate->updates;
    change();
    return delegate->updates - before;
  };
  EXPECT_EQ(updatesAfter([&] { model->updateTransitLineItemResult_captureAnalytics(result, analytics); }), 0);
  EXPECT_EQ(updatesAfter([&] {
              // The same content in new objects.
              model->updateTransitLineItemResult_captureAnalytics(
                  success({lineItem(1, "1", {incident(10), incident(11)}), lineItem(2, "2")}), analytics);
            }),
            0);
  EXPECT_EQ(updatesAfter([&] {
              model->updateTransitLineItemResult_captureAnalytics(success({lineItem(1, "1", {incident(10)})}),
                                                                  analytics);
            }),
            1);
  EXPECT_EQ(updatesAfter([&] { model->setRowHeight_maxNumberOfRows(55, 0); }), 1);
  EXPECT_EQ(updatesAfter([&] { model->setRowHeight_maxNumberOfRows(55, 0); }), 0);
  EXPECT_EQ(updatesAfter([&] { model->setRowHeight_maxNumberOfRows(60, 7); }), 0) << "a limit that changes no row";
  EXPECT_EQ(updatesAfter([&] { model->setAvailableWidth(400); }), 0) << "a width that changes no shield";
}

TEST_F(TableModel, ChangesItsRowsWhenAnIncidentEnds) {
  const Date end = dateByAdding(TestPlatform::startDate(), 60);
  make(success({lineItem(1, "1", {incident(10, {}, end)})}));
  platform.time.advance(60);
  model->recalculateDataSourceItemsWithAnalytics(nullptr);
  EXPECT_EQ(delegate->updates, 0) << "an incident that ends now is still shown";
  platform.time.advance(1);
  model->recalculateDataSourceItemsWithAnalytics(nullptr);
  EXPECT_EQ(delegate->updates, 1);
}

TEST_F(TableModel, ShrinksShieldsIntoTheColumnOfTheWidth) {
  platform.shieldRenderer->width = [](std::int64_t size, const std::string&) {
    return 40.0 + 20.0 * static_cast<double>(size);
  };
  make(success({lineItem(1, "1", {incident(10)}), lineItem(2, "2")}), 0, 359);
  const auto shieldSize = [&] {
    const auto& item = dynamic_cast<const NBTransitItem&>(*model->shieldAjustedSummaryItem());
    return dynamic_cast<const SizedTransitArtwork&>(*item.artwork()->artworkSource()).shieldSize();
  };
  // 359 - 214 leaves 145 points: size 5 is 140 wide.
  EXPECT_EQ(shieldSize(), 5);
  EXPECT_EQ(model->artworkColumnWidth(), 140.0);
  model->setAvailableWidth(200);
  EXPECT_EQ(shieldSize(), 1);
  EXPECT_EQ(model->artworkColumnWidth(), 73.0);
  EXPECT_EQ(delegate->updates, 1);
}

TEST_F(TableModel, OpensOnlyRowsThatHaveSomethingToOpen) {
  make(success({lineItem(1, "1")}));  // the all-clear row opens the favourites
  EXPECT_TRUE(table->selectRowAtIndexPath({0, 0}));
  ASSERT_EQ(delegate->opened.size(), 1u);
  EXPECT_NE(dynamic_cast<const NBURLOpenable*>(delegate->opened[0].get()), nullptr);
  EXPECT_EQ(table->highlightedRow(), std::nullopt) << "deselected at once";

  make(Result::resultWithError(Error::errorWithDomain_code_reason("D", 1, "no")));
  EXPECT_FALSE(table->selectRowAtIndexPath({0, 0}));
  EXPECT_FALSE(model->tableView_shouldHighlightRowAtIndexPath(*table, {0, 5}));
  EXPECT_FALSE(model->tableView_shouldHighlightRowAtIndexPath(*table, {1, 0}));
  EXPECT_EQ(delegate->opened.size(), 1u);
}

}  // namespace
}  // namespace nimbo
