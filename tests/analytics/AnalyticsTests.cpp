#include "analytics/NBTransitIncidentsAnalyticsDelegate.h"
#include "support/TestPlatform.h"
#include "support/WidgetHostDouble.h"

namespace nimbo {
namespace {

using testing::ElementsAre;
using Action = RecordingAnalyticsPipeline::Action;

class Analytics : public testing::Test {
 protected:
  const RecordingAnalyticsPipeline::Interaction& closed() const { return platform.analytics.interactions.back(); }

  TestPlatform platform;
  WidgetHostDouble host;
  std::shared_ptr<ViewControllerDouble> controller = std::make_shared<ViewControllerDouble>(&host);
  std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> session =
      NBTransitIncidentsAnalyticsDelegate::initWithTransitIncidentsViewController(controller);
};

TEST_F(Analytics, RecordsTheModesOfASessionAndItsLength) {
  session->recordWidgetChangeDisplayMode(WidgetDisplayMode::Expanded);
  session->recordCloseSessionSwiping();
  EXPECT_TRUE(platform.analytics.actions.empty());
  EXPECT_TRUE(platform.analytics.interactions.empty());

  session->startSessionIfNeeded();
  platform.time.advance(5);
  session->startSessionIfNeeded();  // appeared again: the start stays
  session->recordWidgetChangeDisplayMode(WidgetDisplayMode::Expanded);
  session->recordWidgetChangeDisplayMode(WidgetDisplayMode::Compact);
  platform.time.advance(2.5);
  session->recordCloseSessionSwiping();
  session->recordCloseSessionSwiping();
  EXPECT_THAT(platform.analytics.actions, ElementsAre(Action{10, 706, {}}, Action{11, 706, {}}));
  ASSERT_EQ(platform.analytics.interactions.size(), 1u);
  EXPECT_EQ(closed().widgetType, 2);
  EXPECT_EQ(closed().endState, 2);
  EXPECT_EQ(closed().startDate, TestPlatform::startDate());
  EXPECT_EQ(closed().duration, 7.5);
  EXPECT_FALSE(closed().record.initiallyExpanded);
  EXPECT_TRUE(closed().record.everExpanded);
  EXPECT_EQ(closed().record.tappedItemIndex, std::nullopt);

  session->startSessionIfNeeded();
  session->recordWidgetChangeDisplayMode(WidgetDisplayMode::Compact);
  session->recordCloseSessionSwiping();
  EXPECT_FALSE(closed().record.everExpanded);

  host.activeMode = WidgetDisplayMode::Expanded;
  session->startSessionIfNeeded();
  session->recordCloseSessionSwiping();
  EXPECT_TRUE(closed().record.initiallyExpanded);
  EXPECT_TRUE(closed().record.everExpanded);
}

TEST_F(Analytics, CountsAsLockedInTheStates1And2) {
  const std::pair<std::deque<int>, bool> cases[] = {
      {{0}, false}, {{1}, true}, {{2}, true}, {{3}, false}, {{0, 2}, true}};
  for (const auto& [states, locked] : cases) {
    platform.deviceLockState.states = states;
    session->startSessionIfNeeded();
    session->recordCloseSessionSwiping();
    EXPECT_EQ(closed().wasLocked, locked) << states.front();
  }
}

TEST_F(Analytics, GathersWhatTheBuildsOfASessionShow) {
  const TransitIncidents shown{incident(1), incident(2), incident(3)};
  const auto line = lineItem(18446744073709551615u, "A");
  const TransitIncidentToLineMap lines{{shown[0], line}};
  const auto report = [&](const TransitLineItems& items, std::size_t count) {
    session->recordInfoForLines_incidentDisplayed_incidentsToLineMapping(
        items, TransitIncidents(shown.begin(), shown.begin() + static_cast<std::ptrdiff_t>(count)), lines);
  };
  report({line}, 3);  // before any session: kept nowhere

  const std::tuple<bool, std::size_t, int> cases[] = {
      {false, 0, 1}, {false, 3, 1}, {true, 0, 2}, {true, 1, 3}, {true, 3, 4}};
  for (const auto& [hasLines, count, messageType] : cases) {
    session->startSessionIfNeeded();
    report(hasLines ? TransitLineItems{line} : TransitLineItems{}, count);
    session->recordCloseSessionSwiping();
    EXPECT_EQ(closed().record.transitMessageType, messageType);
    EXPECT_EQ(closed().record.incidentItems.size(), count);
  }

  session->startSessionIfNeeded();
  report({line}, 1);
  report({line}, 3);
  report({line}, 2);
  session->recordCloseSessionSwiping();
  std::vector<std::string> items;
  for (const auto& item : closed().record.incidentItems)
    items.push_back(std::to_string(item.count) + " " + item.transitLineMuid + " " + item.transitIncidentTitle);
  EXPECT_THAT(items, ElementsAre("3 18446744073709551615 Incident 1", "2 0 Incident 2", "1 0 Incident 3"));
}

TEST_F(Analytics, EndsWithTheRowThatWasOpened) {
  using enum WidgetDisplayMode;
  const std::tuple<WidgetDisplayMode, int, int> cases[] = {
      {Compact, 0, 0}, {Expanded, 0, 1}, {Expanded, 1, 1}, {Expanded, 2, 2}, {Compact, 2, 2}};
  for (const auto& [mode, row, index] : cases) {
    host.activeMode = mode;
    platform.analytics.actions.clear();
    session->startSessionIfNeeded();
    session->recordOpenItemAtIndexPath({0, row});
    EXPECT_THAT(platform.analytics.actions, ElementsAre(Action{9001, 706, {}}));
    EXPECT_EQ(closed().endState, 1);
    EXPECT_EQ(closed().record.tappedItemIndex, index);
  }
  const std::size_t before = platform.analytics.interactions.size();
  session->recordCloseSessionSwiping();
  session->recordOpenItemAtIndexPath({0, 3});
  EXPECT_EQ(platform.analytics.interactions.size(), before);
  EXPECT_EQ(platform.analytics.actions.size(), 2u);
}

}  // namespace
}  // namespace nimbo
