#include <limits>

#include "platform/ui/Environment.h"
#include "support/RecordingPainter.h"
#include "support/TestPlatform.h"
#include "support/WidgetHostDouble.h"
#include "widget/NBTransitIncidentsViewController.h"

namespace nimbo {
namespace {

using testing::ElementsAre;

class Controller : public testing::Test {
 protected:
  Controller() {
    platform.favorites.setFavorites(Favorites{std::make_shared<const FavoriteTransitLine>(lineItem(1, "1"))});
  }
  void load(WidgetHost* widgetHost) {
    controller = NBTransitIncidentsViewController::initWithNibName_bundle("", "", widgetHost);
    controller->view()->setFrame({0, 0, 300, 110});
  }
  void appear() {
    if (!controller) load(&host);
    controller->viewWillAppear(false);
    controller->viewDidAppear(false);
  }
  void disappear() {
    controller->viewWillDisappear(false);
    controller->viewDidDisappear(false);
  }
  /// Lets the fetch that runs reach the line service, and answers it.
  void answer(const TransitLineItems& items, const ErrorRef& error = nullptr) {
    platform.loop.waitAndDrain([&] { return platform.transitLines.pending() > 0; });
    platform.transitLines.answer(items, error);
    platform.loop.runUntilIdle();
  }
  /// That of the only row of the compact mode.
  std::optional<std::string> title() {
    return dynamic_cast<const NBTransitItem&>(*controller->dataSource()->listItem()->summaryItem()).primaryText();
  }
  NBTransitIncidentsViewController::UpdateHandler record(const std::string& name) {
    return [this, name](WidgetUpdateResult result) {
      answers.push_back(name + (result == WidgetUpdateResult::NewData ? ":new" : ":failed"));
    };
  }

  TestPlatform platform;
  WidgetHostDouble host;
  std::shared_ptr<NBTransitIncidentsViewController> controller;
  std::vector<std::string> answers;
};

const ErrorRef kError = Error::errorWithDomain_code_reason("D", 1, "no");

TEST_F(Controller, AnswersAllThatWaitForOneFetch) {
  appear();
  controller->widgetPerformUpdateWithCompletionHandler(record("first"));
  controller->widgetPerformUpdateWithCompletionHandler(record("second"));
  EXPECT_THAT(answers, testing::IsEmpty());
  answer({lineItem(1, "1")});
  EXPECT_THAT(answers, ElementsAre("first:new", "second:new"));
  EXPECT_EQ(platform.transitLines.lookups().size(), 1u);

  // The handler hears of what the widget shows already; whoever asks meanwhile joins the fetch that ends.
  controller->widgetPerformUpdateWithCompletionHandler([&](WidgetUpdateResult result) {
    EXPECT_EQ(title(), "TransitWidgetLoadingError_Title");
    record("third")(result);
    controller->widgetPerformUpdateWithCompletionHandler(record("inside"));
  });
  answer({}, kError);
  EXPECT_THAT(answers, ElementsAre("first:new", "second:new", "third:failed", "inside:failed"));
  EXPECT_EQ(platform.transitLines.lookups().size(), 2u);
  EXPECT_EQ(controller->request(), nullptr);

  controller->widgetPerformUpdateWithCompletionHandler(record("late"));
  const std::weak_ptr<NBTransitIncidentsViewController> weak = controller;
  controller = nullptr;
  EXPECT_TRUE(weak.expired()) << "a running fetch does not keep the controller alive";
  answer({lineItem(1, "1")});
  EXPECT_EQ(answers.back(), "late:new");
}

TEST_F(Controller, KeepsAnUpdaterOnlyWhileVisibleWithLineItems) {
  appear();
  EXPECT_EQ(controller->updater(), nullptr) << "before the first fetch";
  answer({lineItem(1, "1")});
  const auto first = controller->updater();
  ASSERT_NE(first, nullptr);
  EXPECT_EQ(first->refreshInterval(), 1800.0);

  platform.time.advance(1800);
  answer({lineItem(1, "1")});
  EXPECT_NE(controller->updater(), first);
  EXPECT_EQ(platform.time.pendingTimers(), 1u) << "the old one still runs";
  platform.time.advance(1800);
  answer({}, kError);
  EXPECT_EQ(controller->updater(), nullptr) << "after a failed fetch";

  controller->widgetPerformUpdateWithCompletionHandler(nullptr);
  answer({lineItem(1, "1")});
  controller->widgetPerformUpdateWithCompletionHandler(nullptr);
  disappear();
  EXPECT_EQ(controller->updater(), nullptr);
  EXPECT_EQ(platform.time.pendingTimers(), 0u);
  const TransitLineItems ending{lineItem(1, "1", {incident(1, {}, dateByAdding(currentDate(), 60))})};
  answer(ending);
  EXPECT_EQ(controller->updater(), nullptr) << "a fetch that ends while hidden";
  EXPECT_EQ(title(), "Incident 1");
  platform.time.advance(7200);
  // The last words of an updater that is gone.
  controller->transitIncidentUpdater_dateExpired(*first, currentDate());
  controller->transitIncidentUpdaterNeedsRefresh(*first);
  platform.loop.runUntilIdle();
  EXPECT_EQ(title(), "Incident 1");
  EXPECT_EQ(controller->request(), nullptr) << "nothing is fetched while hidden";

  controller->viewWillAppear(false);
  EXPECT_NE(controller->updater(), nullptr) << "made again from the last result";
  controller = nullptr;
  EXPECT_EQ(platform.time.pendingTimers(), 0u);
}

TEST_F(Controller, FetchesBeforeItHasAView) {
  controller = NBTransitIncidentsViewController::initWithNibName_bundle("", "", &host);
  controller->widgetPerformUpdateWithCompletionHandler(record("early"));
  answer({lineItem(1, "1")});
  EXPECT_THAT(answers, ElementsAre("early:new"));
  EXPECT_FALSE(controller->isViewLoaded());
  EXPECT_FALSE(controller->isVisible());
  EXPECT_EQ(controller->updater(), nullptr);
  controller->view();
  appear();
  EXPECT_NE(controller->updater(), nullptr);
}

TEST_F(Controller, KeepsItsTableInsideTheMargins) {
  host.expandedMaximum.width = 300;
  load(&host);
  EXPECT_EQ(controller->dataSource()->availableWidth(), 359);
  controller->view()->setLayoutMargins({8, 16, 4, 20});
  controller->view()->layoutIfNeeded();
  EXPECT_EQ(controller->tableView()->superview(), controller->view().get());
  EXPECT_EQ(controller->tableView()->frame(), (Rect{16, 8, 264, 98}));
  controller->viewWillTransitionToSize_withTransitionCoordinator({400, 1}, nullptr);
  EXPECT_EQ(controller->dataSource()->availableWidth(), 400);

  appear();
  answer({lineItem(1, "1", {incident(1), incident(2)})});
  host.activeMode = WidgetDisplayMode::Expanded;
  controller->widgetActiveDisplayModeDidChange_withMaximumSize(WidgetDisplayMode::Expanded, {1, 1});
  EXPECT_EQ(host.preferredSizes.back(), (Size{300, 220}));
  EXPECT_EQ(controller->tableView()->numberOfRows(), 2);
  controller->view()->layoutIfNeeded();
  RecordingPainter painter;
  controller->view()->draw(painter);
  ASSERT_EQ(painter.fills.size(), 1u);
  EXPECT_EQ(painter.fills[0].color, VisualEffect::widgetTertiaryVibrancyEffect()->color(Appearance::light));

  EXPECT_GT(controller->artworkCache()->count(), 0u);
  controller->didReceiveMemoryWarning();
  EXPECT_EQ(controller->artworkCache()->count(), 0u);
}

TEST_F(Controller, SignpostsEveryKindOfMemoryPressureWhileItLives) {
  load(nullptr);
  MemoryPressureDouble& pressure = platform.memoryPressure;
  EXPECT_EQ(pressure.queueLabel, "org.nimbo.Map.TransitWidget.memoryPresure");
  EXPECT_EQ(pressure.calls, std::vector<std::string>(4, "activate"));
  using enum MemoryPressureKind;
  const std::string log = "org.nimbo.Map.suggestions TransitWidget ", message = " enableTelemetry=YES ";
  for (const auto& [kind, name] : {std::pair{systemWarning, "SystemMemoryPressureWarning"},
                                   {systemCritical, "SystemMemoryPressureCritical"},
                                   {processWarning, "ProcessMemoryPressureWarning"},
                                   {processCritical, "ProcessMemoryPressureCritical"}}) {
    platform.signposts.events.clear();
    for (const auto& [made, handler] : pressure.handlers)
      if (made == kind) handler();
    EXPECT_THAT(platform.signposts.events, ElementsAre(log + name + message));
  }
  pressure.calls.clear();
  controller = nullptr;
  EXPECT_EQ(pressure.calls, std::vector<std::string>(4, "cancel"));
}

TEST_F(Controller, JudgesItsRowsAnewWhereverTheClockJumps) {
  const auto at = [](double hours) { return dateByAdding(TestPlatform::startDate(), 3600 * hours); };
  const TransitLineItems items{lineItem(1, "1",
                                        {incident(1, dateFromISOText("0001-01-01"), at(2)), incident(2, at(2), at(26)),
                                         incident(3, at(26), dateFromISOText("9999-12-31"))})};
  appear();
  answer(items);
  EXPECT_EQ(title(), "Incident 1");
  platform.time.setNow(at(27));
  platform.time.advance(0);
  EXPECT_EQ(title(), "Incident 3") << "asleep over several dates";
  platform.time.setNow(at(2.5));
  platform.time.advance(1800);
  answer(items);
  EXPECT_EQ(title(), "Incident 2") << "set back a day";
}

TEST_F(Controller, TurnsTheHostsSizesIntoRowsAndWidth) {
  constexpr auto kNoLimit = std::numeric_limits<std::uint64_t>::max();
  const struct {
    double compact, expanded;
    std::uint64_t rows;
  } cases[] = {{110, 350, 3},         {110, 110, 1},           {110, 329.9, 2},
               {110, 50, kNoLimit},   {0, 350, kNoLimit},      {-5, 350, kNoLimit},
               {110, -350, kNoLimit}, {1e-9, 1e300, kNoLimit}, {1, 0x1p64, kNoLimit}};
  for (const auto& c : cases) {
    host.compactMaximum.height = c.compact;
    host.expandedMaximum.height = c.expanded;
    load(&host);
    EXPECT_EQ(controller->dataSource()->maxNumberOfRows(), c.rows) << c.compact << " " << c.expanded;
    EXPECT_EQ(controller->dataSource()->availableWidth(), 359);
  }
  load(nullptr);
  controller->viewWillAppear(false);
  EXPECT_EQ(controller->dataSource()->maxNumberOfRows(), kNoLimit);
  EXPECT_EQ(controller->dataSource()->rowHeight(), 0);
}

TEST_F(Controller, FollowsModesAndTellsTheHostWhatItNeeds) {
  using Action = RecordingAnalyticsPipeline::Action;
  load(&host);
  host.compactMaximum.height = 100;
  appear();
  EXPECT_EQ(controller->dataSource()->rowHeight(), 100);
  EXPECT_EQ(host.largestMode, WidgetDisplayMode::Compact) << "no rows to expand yet";
  answer({lineItem(1, "1", {incident(1), incident(2)})});
  EXPECT_EQ(host.largestMode, WidgetDisplayMode::Expanded);
  EXPECT_EQ(host.preferredSizes.back(), (Size{359, 100}));

  host.activeMode = WidgetDisplayMode::Expanded;
  // The host's own mode counts, not the one that comes with the call.
  controller->widgetActiveDisplayModeDidChange_withMaximumSize(WidgetDisplayMode::Compact, {1, 1});
  EXPECT_TRUE(controller->dataSource()->isExpanded());
  EXPECT_EQ(host.preferredSizes.back(), (Size{359, 200}));
  host.activeMode = WidgetDisplayMode::Compact;
  controller->widgetActiveDisplayModeDidChange_withMaximumSize(WidgetDisplayMode::Expanded, {1, 1});
  EXPECT_FALSE(controller->dataSource()->isExpanded());
  EXPECT_THAT(platform.analytics.actions, ElementsAre(Action{11, 706, {}}, Action{10, 706, {}})) << "as passed";

  host.compactMaximum.height = 80;
  Environment::current().setContentSizeCategory(ContentSizeCategory::extraLarge);
  EXPECT_EQ(controller->dataSource()->rowHeight(), 80);
  disappear();
  host.compactMaximum.height = 90;
  Environment::current().setContentSizeCategory(ContentSizeCategory::large);
  EXPECT_EQ(controller->dataSource()->rowHeight(), 80) << "hidden: does not listen";
}

TEST_F(Controller, RecordsASessionFromAppearingToOpeningOrDisappearing) {
  const auto& sessions = platform.analytics.interactions;
  load(&host);
  controller->viewWillAppear(false);
  platform.time.advance(5);
  controller->viewDidAppear(false);
  answer({lineItem(1, "1")});
  platform.time.advance(2);
  host.opens = false;
  controller->tableView()->selectRowAtIndexPath({0, 0});
  EXPECT_THAT(platform.analytics.actions, testing::IsEmpty()) << "not opened";
  host.opens = true;
  controller->tableView()->selectRowAtIndexPath({0, 0});
  ASSERT_EQ(sessions.size(), 1u);
  EXPECT_EQ(sessions[0].endState, 1);
  EXPECT_EQ(sessions[0].duration, 2);
  EXPECT_EQ(sessions[0].record.tappedItemIndex, 0);
  disappear();
  EXPECT_EQ(sessions.size(), 1u);

  appear();
  controller->viewWillDisappear(false);
  EXPECT_EQ(sessions.size(), 1u);
  controller->viewDidDisappear(false);
  EXPECT_EQ(sessions.size(), 2u);
}

}  // namespace
}  // namespace nimbo
