// What an hour of hosts costs the server of a feed, in virtual time: each host by its rule, all on one cache.

#include <gmock/gmock.h>

#include <list>
#include <random>

#include "desktop/gtfs/LoopbackServer.h"
#include "desktop/gtfs/feeds/FeedMuid.h"
#include "desktop/gtfs/feeds/GTFSTransitLineService.h"
#include "host/Programs.h"
#include "host/RefreshRule.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

class Chance final : public RandomSource {
  std::uint32_t next() override { return static_cast<std::uint32_t>(_engine()); }
  std::mt19937 _engine{1};
};

class RefreshTest : public testing::Test {
 protected:
  struct Host {
    explicit Host(RefreshTest& test)
        : service(test.paths),
          rule(
              test.platform.loop, test.chance, [&test] { return test.areScarce; },
              [&test, this](TimeInterval maxAge) {
                service.shareNext(maxAge);
                test.ask(*this);
              }) {
      service.setSharedAge([&test] { return test.refreshSeconds / 2; });
    }
    GTFSTransitLineService service;
    RefreshRule rule;
    int failures = 0;
  };

  RefreshTest() {
    folder.write("feed/routes.txt", "route_id,route_short_name,route_type\nr1,1,3\n");
    EXPECT_FALSE(FeedConfiguration(paths.config)
                     .add({"city", *FeedAddress::parse((folder.path() / "feed").native()),
                           *FeedAddress::parse(server.address())}));
  }

  void ask(Host& host) {
    std::optional<protocol::UpdateResult> result;
    const TransitLineLocator locator{"city", "", "r1", "1", TransitMode::bus};
    host.service.lookup({std::make_shared<const MapItemIdentifier>(lineMuid("city", "r1"), locator)},
                        [&](const TransitLineItems&, const ErrorRef& error) {
                          result.emplace();
                          if (error) result->updateResult = WidgetUpdateResult::Failed;
                          if (error) ++host.failures;
                        });
    platform.loop.waitAndDrain([&] { return result.has_value(); });
    if (const auto answered = host.service.youngestAnswer()) result->age = std::max(-intervalFromNow(*answered), 0.0);
    result->refreshSeconds = refreshSeconds;
    host.rule.answered(*result);
  }

  TestPlatform platform;
  TemporaryFolder folder;
  Paths paths = Paths::resolve(folder.path() / "config", folder.path() / "state");
  Chance chance;
  TimeInterval refreshSeconds = 60;
  bool areScarce = false;
  std::string head = "200 OK";
  // Each answer is another one: it says when it was made.
  LoopbackServer server{[this](const std::string&) {
    return LoopbackServer::Answer{LoopbackServer::answer(head, AlertsBuilder::feed(platform.time.now(), {}))};
  }};
};

TEST_F(RefreshTest, CostsTheServerAboutSixtyRequestsAnHourHoweverManyHosts) {
  const struct {
    std::string name;
    std::string head;
    int hosts;
    std::size_t least, most;  // requests
    TimeInterval refreshSeconds = 60;
    bool areScarce = false;
    TimeInterval clockIsSet = 0;  // at half time
  } cases[] = {
      {"one", "200 OK", 1, 55, 65},
      {"three", "200 OK", 3, 57, 70},
      {"six", "200 OK", 6, 60, 78},
      {"seldom", "200 OK", 3, 11, 15, 300},
      {"metered", "200 OK", 3, 11, 15, 60, true},
      {"max-age", "200 OK\r\nCache-Control: public, max-age=150", 3, 18, 24},
      {"max-age for ever", "200 OK\r\nCache-Control: max-age=99999999999", 3, 10, 12},
      {"Retry-After", "503 Busy\r\nRetry-After: 600", 3, 3, 7},
      {"Retry-After for ever", "429 Enough\r\nRetry-After: Fri, 01 Jan 2100 00:00:00 GMT", 3, 2, 2},
      {"failing", "500 Oops", 3, 12, 27},
      {"clock set back", "200 OK", 3, 57, 72, 60, false, -86400},
      {"clock set forward", "200 OK", 3, 57, 72, 60, false, 86400},
      {"nothing on screen", "200 OK", 0, 0, 0},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.name);
    std::filesystem::remove_all(paths.cache);
    head = c.head;
    refreshSeconds = c.refreshSeconds;
    areScarce = c.areScarce;
    const std::size_t before = server.requests().size();
    std::list<Host> hosts;
    for (int i = 0; i < std::max(c.hosts, 1); ++i) hosts.emplace_back(*this).rule.setOnScreen(i < c.hosts);
    platform.time.advance(1800);
    if (c.clockIsSet != 0) platform.time.setNow(dateByAdding(platform.time.now(), c.clockIsSet));
    platform.time.advance(1800);
    const std::size_t requests = server.requests().size() - before;
    EXPECT_THAT(requests, testing::AllOf(testing::Ge(c.least), testing::Le(c.most)));
    for (Host& host : hosts) {
      EXPECT_EQ(host.failures > 0, !head.starts_with("200")) << "what is shared is as good as what is fetched";
      host.rule.setOnScreen(false);
    }
    platform.time.advance(1800);
    EXPECT_EQ(server.requests().size() - before, requests) << "nothing is asked for what nobody sees";
    // The timer's half-hourly update takes part.
    if (!head.starts_with("200")) continue;
    hosts.front().rule.setOnScreen(true);
    ask(hosts.back());
    EXPECT_EQ(server.requests().size() - before, requests + 1);
  }
}

TEST_F(RefreshTest, AsksAgainForWhatChangesWhileAnAnswerIsOnItsWay) {
  int asked = 0;
  RefreshRule rule(
      platform.loop, chance, [] { return false; }, [&](TimeInterval) { ++asked; });
  const protocol::UpdateResult good{.refreshSeconds = 60},
      failed{.updateResult = WidgetUpdateResult::Failed, .refreshSeconds = 60};
  const auto isAskedIn = [&](TimeInterval seconds) {
    const int before = asked;
    platform.time.advance(seconds * (1 - RefreshRule::kSpread) - 1);
    EXPECT_EQ(asked, before) << seconds;
    platform.time.advance(seconds * 2 * RefreshRule::kSpread + 1);
    return asked == before + 1;
  };
  rule.askNow();
  EXPECT_EQ(asked, 0) << "nobody sees it";
  rule.setOnScreen(true);
  rule.askNow();
  rule.askNow();
  EXPECT_EQ(asked, 1);
  rule.answered(good);
  EXPECT_EQ(asked, 2);
  rule.answered(good);
  EXPECT_TRUE(isAskedIn(60));
  for (const TimeInterval wait : {30, 60, 120, 240, 480, 960, 1800, 1800}) {
    rule.answered(failed);
    EXPECT_TRUE(isAskedIn(wait)) << wait;
  }
  rule.answered(failed);
  rule.networkReturned();
  EXPECT_EQ(asked, 12);
  rule.answered(failed);
  EXPECT_TRUE(isAskedIn(30));
  rule.answered(good);
  rule.networkReturned();
  EXPECT_EQ(asked, 13) << "nothing was wanting";
}

}  // namespace
}  // namespace nimbo
