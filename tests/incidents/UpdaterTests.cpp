#include "incidents/NBTransitIncidentUpdater.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using testing::ElementsAre;
using Minutes = std::optional<int>;  // from the start of the test's clock

Date at(int minutes) { return dateByAdding(TestPlatform::startDate(), 60.0 * minutes); }

TransitLineItemRef lineWith(const std::vector<std::pair<Minutes, Minutes>>& periods) {
  TransitIncidents incidents;
  for (const auto& [start, end] : periods)
    incidents.push_back(incident(incidents.size(), start ? std::optional(at(*start)) : std::nullopt,
                                 end ? std::optional(at(*end)) : std::nullopt));
  return lineItem(1, "A", std::move(incidents));
}

class Observer final : public NBTransitIncidentUpdaterObserver {
 public:
  void transitIncidentUpdater_dateExpired(NBTransitIncidentUpdater& updater, Date date) override {
    expired.push_back(date);
    if (invalidates) updater.invalidate();
  }
  void transitIncidentUpdaterNeedsRefresh(NBTransitIncidentUpdater&) override { ++refreshes; }
  std::vector<Date> expired;
  int refreshes = 0;
  bool invalidates = false;
};

class Updater : public testing::Test {
 protected:
  std::shared_ptr<NBTransitIncidentUpdater> start(TransitLineItems items) {
    auto updater = NBTransitIncidentUpdater::initWithTransitLineItems_refreshInterval(std::move(items), 1800);
    updater->setObserver(observer);
    return updater;
  }
  TestPlatform platform;
  std::shared_ptr<Observer> observer = std::make_shared<Observer>();
};

TEST_F(Updater, WaitsForTheDatesThatChangeTheRows) {
  const struct {
    std::vector<std::pair<Minutes, Minutes>> periods;
    std::set<Date> dates;
  } cases[] = {
      {{}, {}},
      {{{std::nullopt, std::nullopt}, {-10, std::nullopt}, {-10, -5}, {-10, 0}}, {}},
      {{{-10, 30}, {std::nullopt, 30}, {0, 20}}, {at(20), at(30)}},
      {{{10, 70}, {15, std::nullopt}}, {at(10), at(15), at(70)}},
      {{{10, 5}, {10, -5}}, {at(-5), at(5), at(10)}},  // the end of what is still to start counts as it stands
  };
  for (const auto& [periods, dates] : cases) {
    const auto updater = start({lineItem(2, "B"), lineWith(periods)});
    EXPECT_EQ(updater->updateDates(), dates);
    const bool waits = !dates.empty() && *dates.begin() > TestPlatform::startDate();
    EXPECT_EQ(platform.time.pendingTimers(), waits ? 2u : 1u);
    updater->invalidate();
  }
}

TEST_F(Updater, TellsEachDateOnceAndAsksForARefreshAtEachInterval) {
  const auto updater = start({lineWith({{10, 70}})});
  EXPECT_EQ(updater->refreshInterval(), 1800);
  EXPECT_THAT(platform.loop.tolerances, ElementsAre(180));
  EXPECT_EQ(updater->lineItems().size(), 1u);
  platform.time.advance(600);
  EXPECT_THAT(updater->updateDates(), ElementsAre(at(70)));
  platform.time.advance(1199);
  EXPECT_EQ(observer->refreshes, 0);
  platform.time.advance(75 * 60);
  EXPECT_THAT(observer->expired, ElementsAre(at(10), at(70)));
  EXPECT_THAT(updater->updateDates(), testing::IsEmpty());
  EXPECT_EQ(observer->refreshes, 3);
  for (const auto& line : platform.log.lines()) {
    EXPECT_EQ(line.level, LogLevel::debug) << line.text;
    EXPECT_EQ(line.redacted.find("2026"), std::string::npos) << "not private: " << line.redacted;
  }
  observer = nullptr;
  platform.time.advance(1800);  // nobody listens
  updater->invalidate();
}

TEST_F(Updater, StopsAtADateThatPassedUnseen) {
  for (const int wakesUpAt : {20, 25}) {  // asleep meanwhile
    const auto updater = start({lineWith({{10, 20}, {30, std::nullopt}})});
    platform.time.setNow(at(wakesUpAt));
    platform.time.advance(0);
    EXPECT_THAT(observer->expired, ElementsAre(at(10)));
    EXPECT_THAT(updater->updateDates(), ElementsAre(at(20), at(30)));
    EXPECT_EQ(platform.time.pendingTimers(), 1u);  // the refresh
    updater->invalidate();
    observer->expired.clear();
    platform.time.setNow(at(0));
  }
}

TEST_F(Updater, LivesAndFiresUntilInvalidated) {
  std::weak_ptr<NBTransitIncidentUpdater> updater = start({lineWith({{10, 20}})});
  ASSERT_FALSE(updater.expired());
  observer->invalidates = true;
  platform.time.advance(3600);
  EXPECT_THAT(observer->expired, ElementsAre(at(10)));
  EXPECT_EQ(observer->refreshes, 0);
  EXPECT_EQ(platform.time.pendingTimers(), 0u);
  EXPECT_TRUE(updater.expired());
}

}  // namespace
}  // namespace nimbo
