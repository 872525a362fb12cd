#include <cstdlib>
#include <iostream>
#include <set>

#include "desktop/gtfs/Fixtures.h"
#include "desktop/gtfs/static/LineItems.h"
#include "desktop/gtfs/static/StaticFeedStore.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using transit_realtime::Alert;
using transit_realtime::EntitySelector;
using transit_realtime::FeedMessage;

// An independent reading of the published feeds: protoc's generated code and the plainest rules, alert by alert.

bool isInForce(const Alert& alert, std::uint64_t now) {
  const auto& periods = alert.impact_period_size()          ? alert.impact_period()
                        : alert.communication_period_size() ? alert.communication_period()
                                                            : alert.active_period();
  bool result = periods.empty();
  for (const auto& period : periods) {
    const bool hasEnd = period.end() != 0 && period.end() != UINT64_MAX;
    if (hasEnd && period.end() <= period.start()) continue;
    result = result || (period.start() <= now && (!hasEnd || now <= period.end()));
  }
  return result;
}

bool concerns(const EntitySelector& selector, const TransitLineLocator& line, const std::set<std::string>& agencies) {
  const std::string& route = selector.route_id().empty() ? selector.trip().route_id() : selector.route_id();
  const bool isOtherAgency = !selector.agency_id().empty() && selector.agency_id() != line.agencyID;
  if (!route.empty()) return route == line.routeID && !(isOtherAgency && agencies.contains(selector.agency_id()));
  if (selector.has_trip() || selector.has_stop_id() || isOtherAgency) return false;
  return !selector.agency_id().empty();  // no feed here has a selector by route type alone
}

bool concerns(const Alert& alert, const TransitLineLocator& line, const std::set<std::string>& agencies) {
  const bool isMinor = (alert.effect() == 10 || alert.effect() == 11) && alert.severity_level() != 4;
  bool result = false;
  for (const auto& selector : alert.informed_entity()) result = result || concerns(selector, line, agencies);
  return result && !isMinor;
}

std::string withoutSpaces(std::string text) {
  std::erase_if(text, [](unsigned char c) { return std::isspace(c); });
  return text;
}

/// The title without spaces; empty where more is done to the published one than folding them.
std::string simpleTitle(const Alert& alert) {
  const auto& all = alert.header_text().translation();
  const auto one = std::ranges::find_if(all, [&](const auto& t) { return all.size() == 1 || t.language() == "en"; });
  if (one == all.end() || one->text().find_first_of("<&") != std::string::npos) return {};
  return one->text().find("\u200C") == std::string::npos ? withoutSpaces(one->text()) : std::string();
}

/// The folder with the lines of a feed: its own, or one with the routes that the alerts name.
std::filesystem::path linesOf(const std::filesystem::path& published, const FeedMessage& message,
                              const TemporaryFolder& folder) {
  if (std::filesystem::exists(published / "routes.txt")) return published;
  std::set<std::string> routes;
  for (const auto& entity : message.entity())
    for (const auto& selector : entity.alert().informed_entity()) routes.insert(selector.route_id() + ",3\n");
  std::string table = "route_id,route_type\n";
  for (const std::string& route : routes) table += route;
  return folder.write(published.filename().native() + "/routes.txt", table).parent_path();
}

TEST(PublishedFeeds, AgreeWithAnIndependentReading) {
  const char* feeds = std::getenv("NIMBO_FEEDS_DIR");
  if (!feeds) GTEST_SKIP() << "NIMBO_FEEDS_DIR names no folder of published feeds";
  const TestPlatform platform;
  const TemporaryFolder folder;
  int affected = 0, good = 0;
  for (const auto& published : std::filesystem::directory_iterator(feeds)) {
    const auto bytes = readFile(published.path() / "alerts.pb", 64 << 20);
    if (!bytes) continue;
    SCOPED_TRACE(published.path());
    FeedMessage message;
    ASSERT_TRUE(message.ParseFromString(*bytes));
    const std::string name = published.path().filename();
    const auto loaded = StaticFeedStore(FeedCache(folder.path() / "cache"))
                            .load({name, *FeedAddress::parse(linesOf(published, message, folder).native()),
                                   *FeedAddress::parse("/none")},
                                  {});
    const auto alerts = AlertsFeed::read(*bytes, "test");
    ASSERT_TRUE(loaded && alerts);
    IncidentQuery query{.feed = name, .language = {"en", ""}, .trips = loaded->trips};
    query.now = dateFromUnixTime(static_cast<double>(message.header().timestamp()));
    std::set<std::string> agencies;
    for (std::uint32_t i = 0; i < loaded->feed.lineCount(); ++i) {
      query.lines.push_back({i, loaded->feed.line(i).muid});
      agencies.emplace(loaded->feed.agency(loaded->feed.line(i).agency).id);
    }
    const IncidentReading reading = readIncidents(*alerts, loaded->feed, query);
    const LineItems items(name, loaded->feed);
    for (const auto& line : query.lines) {
      const TransitLineLocator locator = items.locatorOf(line.index);
      const Verdict& verdict = reading.verdicts[line.index];
      EXPECT_EQ(verdict.unknownReason(), nullptr) << locator.routeID;
      std::set<std::string> titles;
      for (const auto& incident : verdict.incidents())
        if (Verdict::of({incident}, nullptr).isAffected(query.now)) titles.insert(withoutSpaces(*incident->title()));
      bool mustBeAffected = false;
      for (const auto& entity : message.entity()) {
        if (!concerns(entity.alert(), locator, agencies) || !isInForce(entity.alert(), message.header().timestamp()))
          continue;
        mustBeAffected = true;
        const std::string title = simpleTitle(entity.alert());
        EXPECT_TRUE(title.empty() || titles.contains(title)) << locator.routeID << ": " << title;
      }
      EXPECT_EQ(!titles.empty(), mustBeAffected) << locator.routeID;
      ++(mustBeAffected ? affected : good);
    }
  }
  EXPECT_GT(affected + good, 0) << feeds;
  std::cout << affected << " lines affected, " << good << " good\n";
}

}  // namespace
}  // namespace nimbo
