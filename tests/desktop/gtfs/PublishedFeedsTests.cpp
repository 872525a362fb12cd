#include <cstdlib>
#include <iostream>
#include <set>
#include <sstream>

#include "desktop/gtfs/Fixtures.h"
#include "desktop/gtfs/feeds/FeedCatalog.h"
#include "desktop/gtfs/feeds/GTFSTransitLineService.h"
#include "desktop/gtfs/net/FileReading.h"
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

/// The title, where it takes no more than folding white space to get it.
std::optional<std::string> simpleTitle(const Alert& alert) {
  for (const auto& translation : alert.header_text().translation()) {
    if (translation.language() != "en" && alert.header_text().translation_size() > 1) continue;
    const std::string& text = translation.text();
    if (text.find_first_of("<&") != std::string::npos || text.find("\xE2\x80\x8C") != std::string::npos) return {};
    std::istringstream words(text);
    std::string title;
    for (std::string word; words >> word;) title += (title.empty() ? "" : " ") + word;
    if (!title.empty()) return title;
  }
  return {};
}

class PublishedFeeds : public testing::Test {
 protected:
  /// The folder with the lines of a feed: its own, or one with the routes that the alerts name.
  std::filesystem::path linesOf(const std::filesystem::path& published, const FeedMessage& message) {
    if (std::filesystem::exists(published / "routes.txt")) return published;
    std::set<std::string> routes;
    for (const auto& entity : message.entity())
      for (const auto& selector : entity.alert().informed_entity()) routes.insert(selector.route_id());
    std::string table = "route_id,route_type\n";
    for (const std::string& route : routes)
      if (!route.empty()) table += route + ",3\n";
    return folder.write(published.filename().native() + "/routes.txt", table).parent_path();
  }

  void compare(const std::filesystem::path& published) {
    SCOPED_TRACE(published.native());
    FeedMessage message;
    ASSERT_TRUE(message.ParseFromString(*readFile(published / "alerts.pb", 64 << 20)));
    const std::uint64_t now = message.header().timestamp();
    platform.time.setNow(dateFromUnixTime(static_cast<double>(now)));
    const std::string name = published.filename();
    ASSERT_FALSE(FeedConfiguration(paths.config)
                     .add({name, *FeedAddress::parse(linesOf(published, message).native()),
                           *FeedAddress::parse((published / "alerts.pb").native())}));
    const FeedLibrary library(paths);
    std::vector<MapItemIdentifierRef> identifiers;
    std::set<std::string> agencies;
    const auto lines = FeedCatalog(library).find({.limit = SIZE_MAX});
    ASSERT_TRUE(lines->errors.empty());
    for (const auto& [line, longName] : lines->lines)
      if (line->identifier()->locator()->feed == name) {
        identifiers.push_back(line->identifier());
        agencies.insert(line->identifier()->locator()->agencyID);
      }
    bool isDone = false;
    service.lookup(identifiers, [&](const TransitLineItems& items, const ErrorRef& error) {
      isDone = true;
      EXPECT_FALSE(error);
      EXPECT_EQ(items.size(), identifiers.size());
      for (const auto& item : items) compare(*item, message, agencies, now);
    });
    platform.loop.waitAndDrain([&] { return isDone; });
  }

  void compare(const TransitLineItem& item, const FeedMessage& message, const std::set<std::string>& agencies,
               std::uint64_t now) {
    const TransitLineLocator& locator = *item.identifier()->locator();
    std::set<std::string> titles;
    bool isAffected = false;
    for (const auto& incident : item.incidents())
      if ((!incident->startDate() || intervalFromNow(*incident->startDate()) <= 0) &&
          (!incident->endDate() || intervalFromNow(*incident->endDate()) >= 0)) {
        isAffected = true;
        titles.insert(incident->title().value());
      }
    bool mustBeAffected = false;
    for (const auto& entity : message.entity()) {
      if (!concerns(entity.alert(), locator, agencies) || !isInForce(entity.alert(), now)) continue;
      mustBeAffected = true;
      const auto title = simpleTitle(entity.alert());
      EXPECT_TRUE(!title || titles.contains(*title)) << locator.routeID << ": " << *title;
    }
    EXPECT_EQ(isAffected, mustBeAffected) << locator.routeID;
    ++(isAffected ? affectedLines : goodLines);
  }

  TestPlatform platform;
  TemporaryFolder folder;
  Paths paths = Paths::resolve(folder.path() / "config", folder.path() / "state");
  GTFSTransitLineService service{paths};
  int affectedLines = 0, goodLines = 0;
};

TEST_F(PublishedFeeds, AgreeWithAnIndependentReading) {
  const char* feeds = std::getenv("NIMBO_FEEDS_DIR");
  if (!feeds) GTEST_SKIP() << "NIMBO_FEEDS_DIR names no folder of published feeds";
  int count = 0;
  for (const auto& entry : std::filesystem::directory_iterator(feeds))
    if (std::filesystem::exists(entry.path() / "alerts.pb")) {
      compare(entry.path());
      ++count;
    }
  EXPECT_GT(count, 0) << feeds;
  std::cout << count << " feeds: " << affectedLines << " lines affected, " << goodLines << " good\n";
}

}  // namespace
}  // namespace nimbo
