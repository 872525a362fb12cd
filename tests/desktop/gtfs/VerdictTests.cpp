// The rules of docs/architecture.md, "The verdict", one test each: when a line is affected, good, or unknown.

#include "desktop/gtfs/Fixtures.h"
#include "desktop/gtfs/Gzip.h"
#include "desktop/gtfs/LoopbackServer.h"
#include "desktop/gtfs/feeds/FeedCheck.h"
#include "desktop/gtfs/feeds/FeedMuid.h"
#include "desktop/gtfs/feeds/GTFSTransitLineService.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using namespace std::string_literals;
using Answer = LoopbackServer::Answer;
using Code = TransitLineServiceError;

std::string field(int number, const std::string& bytes) {
  return std::string{static_cast<char>(number << 3 | 2), static_cast<char>(bytes.size())} + bytes;
}
std::string selectorOf(const std::string& fields) { return field(5, fields); }
std::string entity(const std::string& fields) { return field(2, fields); }
std::string alertEntity(const std::string& body) { return entity(field(1, "x") + field(5, body)); }

const std::string kHeader = field(1, field(1, "2.0"));
const std::string kRoute = selectorOf(field(2, "r1"));
const std::string kTitle = field(10, field(1, field(1, "T")));
const std::string kCutText = field(10, "").substr(0, 1) + "\x7F";
const std::string kVehicle = entity(field(1, "v") + field(4, ""));
const std::string kTripUpdate = entity(field(1, "u") + field(3, ""));

/// A feed "city" with a line r1, looked up by a line service that is new each time. The clock stands at kNow.
class VerdictTest : public testing::Test {
 protected:
  VerdictTest() {
    platform.time.setNow(dateFromUnixTime(kNow));
    folder.write("feed/agency.txt", "agency_id,agency_name\nA,Trams\n");
    folder.write("feed/routes.txt", "route_id,agency_id,route_short_name,route_type\nr1,A,1,0\nr2,A,2,0\n");
    folder.write("feed/trips.txt", "route_id,trip_id\nr1,trip-1\n");
  }

  std::string verdict() { return verdictOn("r1", "1"); }
  std::string verdictOn(const std::string& routeID, const std::string& shortName) {
    FeedConfiguration configuration(paths.config);
    static_cast<void>(configuration.remove("city"));
    EXPECT_FALSE(configuration.add(feed));
    const auto line = std::make_shared<const MapItemIdentifier>(
        lineMuid("city", routeID), TransitLineLocator{"city", "A", routeID, shortName, TransitMode::tram});
    std::string text;
    GTFSTransitLineService service(paths);
    service.lookup({line}, [&](const TransitLineItems& items, const ErrorRef& error) {
      text = error                              ? "unknown " + std::to_string(error->code())
             : items.at(0)->incidents().empty() ? "good"
                                                : "affected";
      if (!error)
        for (const auto& incident : items.at(0)->incidents()) text += ": " + *incident->title();
    });
    platform.loop.waitAndDrain([&] { return !text.empty(); });
    return text;
  }
  /// By these bytes in the file of alerts, written at kNow.
  std::string verdictBy(const std::string& bytes) {
    setFileDate(folder.write("alerts.pb", bytes), kNow);
    return verdict();
  }
  static void setFileDate(const std::filesystem::path& path, std::uint64_t time) {
    const auto date = std::chrono::sys_seconds(std::chrono::seconds(time));
    std::filesystem::last_write_time(path, std::chrono::file_clock::from_sys(date));
  }
  static std::string unknown(Code code) { return "unknown " + std::to_string(static_cast<int>(code)); }

  TestPlatform platform;
  TemporaryFolder folder;
  Paths paths = Paths::resolve(folder.path() / "config", folder.path() / "state");
  Feed feed{"city", *FeedAddress::parse((folder.path() / "feed").native()),
            *FeedAddress::parse((folder.path() / "alerts.pb").native())};
};

/// The same with the alerts on a server whose answer the test sets.
class ServedVerdictTest : public VerdictTest {
 protected:
  ServedVerdictTest() { feed.alerts = *FeedAddress::parse(server.address()); }
  std::string verdictBy(const std::string& head, const std::string& body) {
    answer.bytes = LoopbackServer::answer(head, body);
    return verdict();
  }

  Answer answer;
  LoopbackServer server{[this](const std::string&) { return answer; }};
};

TEST_F(VerdictTest, ABodyIsAFeedWhenItHasAHeaderWithAVersion) {
  const std::string timestampOfFixedWidth = "\x19"s + std::string(8, '\1');
  const std::pair<std::string, std::string> cases[] = {
      {kHeader, "good"},
      {kHeader + alertEntity(kTitle + kRoute), "affected: T"},
      {"\r\n404", unknown(Code::badAlerts)},
      {"\x0D"
       "404!" +
           alertEntity(kTitle + kRoute),
       unknown(Code::badAlerts)},
      {field(1, ""), unknown(Code::badAlerts)},
      {field(1, field(1, "")), unknown(Code::badAlerts)},
      {field(1, "\x08\x02"), unknown(Code::badAlerts)},
      {field(1, field(1, "2.0") + timestampOfFixedWidth), unknown(Code::badAlerts)},
      {kHeader + "\x10\x01", unknown(Code::badAlerts)},
  };
  for (const auto& [bytes, expected] : cases) EXPECT_EQ(verdictBy(bytes), expected) << testing::PrintToString(bytes);
}

TEST_F(VerdictTest, AnAlertThatBreaksOffCountsWithWhatWasRead) {
  const std::string noService = "\x38\x01", noEffect = "\x38\x0A";
  const std::string unknownAlert = unknown(Code::cutOff);
  const std::tuple<const char*, std::string, std::string> cases[] = {
      {"behind its title", alertEntity(kRoute + kTitle + kCutText), "affected: T"},
      {"in its title: the effect's words", alertEntity(kRoute + noService + kCutText), "affected: No service"},
      {"before its effect", alertEntity(kRoute + kCutText), "affected: Service notice"},
      {"before what may make it severe", alertEntity(kRoute + noEffect + kCutText), "affected: Service notice"},
      {"without an identifier", entity(field(5, kRoute + kTitle + kCutText)), "affected: T"},
      {"whole, without an identifier", entity(field(5, kRoute + kTitle)), "affected: T"},
      {"in its entity", entity(field(1, "x") + "\x2A\x7F" + kRoute + kTitle), "affected: T"},
      {"in a period, which is open then", alertEntity(field(1, "\x10\x80") + kRoute + kTitle), "affected: T"},
      {"behind another line", alertEntity(selectorOf(field(2, "r2")) + kTitle + kCutText), "good"},
      {"before any selector", alertEntity(kTitle + kCutText), unknownAlert},
      {"in its entity, before any selector", entity(field(1, "x") + "\x2A\x7F" + kTitle), unknownAlert},
      {"in its only selector", alertEntity(kTitle + selectorOf("\x12\x7Fr1")), unknownAlert},
      {"a route that is a number", alertEntity(kTitle + selectorOf("\x10\x01")), unknownAlert},
      {"its entity does, before the alert", entity("\x0A\x7Fx"), unknownAlert},
      {"whole, about nothing", alertEntity(kTitle), "good"},
      {"whole, with an unknown extension", alertEntity(kTitle + kRoute + "\xC2\x3E\x01?"), "affected: T"},
  };
  for (const auto& [what, entity, expected] : cases) EXPECT_EQ(verdictBy(kHeader + entity), expected) << what;
}

TEST_F(VerdictTest, AnAlertByTripAloneNeedsTheTrips) {
  const std::string trip = "informed_entity { trip { trip_id: 'trip-1' } } ";
  const std::string over = "active_period { end: " + std::to_string(kNow - 5) + " } ";
  const std::string noTrips = unknown(Code::tripsMissing);
  const std::tuple<const char*, const char*, std::string, std::string> cases[] = {
      {"a whole table", "route_id,trip_id\nr1,trip-1\n", alert("a", "T", trip), "affected: T"},
      {"which lacks the trip", "route_id,trip_id\nr1,trip-2\n", alert("a", "T", trip), "good"},
      {"no table", nullptr, alert("a", "T", trip), noTrips},
      {"no table that is needed", nullptr, alert("a", "T", route("r2")), "good"},
      {"a broken table", "<html>gone</html>", alert("a", "T", trip), noTrips},
      {"for an alert that is over", nullptr, alert("a", "T", trip + over), "good"},
      {"for one that is not shown", nullptr, alert("a", "T", trip + "effect: 10"), "good"},
      {"for one that says nothing", nullptr, alert("a", " ", trip), "good"},
  };
  for (const auto& [what, trips, alert, expected] : cases) {
    std::filesystem::remove(folder.path() / "feed/trips.txt");
    if (trips) folder.write("feed/trips.txt", trips);
    // Also from the cache.
    for (int i = 0; i < 2; ++i) EXPECT_EQ(verdictBy(feedBytes(alert)), expected) << what;
  }
}

TEST_F(VerdictTest, TripsThatAreLostMakeUnknown) {
  const std::string zip = zipOf(
      {{"routes.txt", "route_id,agency_id,route_type\nr1,A,0\n"}, {"trips.txt", "route_id,trip_id\nr1,trip-1\n"}});
  Answer answer{LoopbackServer::answer("200 OK", zip)};
  const LoopbackServer server([&](const std::string&) { return answer; });
  feed.staticFeed = *FeedAddress::parse(server.address());
  const std::string alerts = feedBytes(alert("a", "T", "informed_entity { trip { trip_id: 'trip-1' } }"));
  EXPECT_EQ(verdictBy(alerts), "affected: T");
  const auto kept = FeedCache(paths.cache).trips("city");
  for (const bool isDamaged : {false, true}) {
    std::filesystem::remove(kept);
    if (isDamaged) std::ofstream(kept) << "damaged";
    answer.bytes = LoopbackServer::answer("500 Oops", "");
    EXPECT_EQ(verdictBy(alerts), unknown(Code::serverFailure));
    EXPECT_EQ(verdictBy(feedBytes("")), "good") << "nobody asks for them";
    answer.bytes = LoopbackServer::answer("200 OK", zip);
    EXPECT_EQ(verdictBy(alerts), "affected: T");
  }

  // Another process has read a feed that has changed.
  feed.staticFeed = *FeedAddress::parse((folder.path() / "feed").native());
  const StaticFeedStore store(FeedCache(folder.path() / "cache"));
  ASSERT_TRUE(store.load(feed, {}));
  const auto loaded = store.load(feed, {});
  std::filesystem::remove(FeedCache(folder.path() / "cache").trips("city"));
  folder.write("feed/trips.txt", "route_id,trip_id\nr2,other\n");
  EXPECT_FALSE(loaded->trips("trip-1"));
}

TEST_F(VerdictTest, IdentifiersAreComparedAsPublished) {
  const std::string mark = "\xEF\xBB\xBF";
  const std::pair<std::string, std::string> routes[] = {
      {" r1 ", "r1"},      {"r1", " r1\r\n"},    {"r\xDF", "r\xDF"},  {"r\xC3\x9F", "r\xDF"},
      {"r1", mark + "r1"}, {mark + " r1", "r1"}, {"r1" + mark, "r1 "}};
  for (const auto& [published, named] : routes) {
    folder.write("feed/routes.txt", "route_type,route_short_name,agency_id,route_id\n0,1, A ," + published + "\n");
    folder.write("feed/trips.txt", "trip_id,route_id\ntrip\xE9 ," + published + "\n");
    for (const std::string& selector : {selectorOf(field(2, named)), selectorOf(field(1, "A ") + field(2, named)),
                                        selectorOf(field(1, mark + "A")), selectorOf(field(4, field(1, " trip\xE9")))})
      EXPECT_EQ(verdictBy(kHeader + alertEntity(kTitle + selector)), "affected: T")
          << testing::PrintToString(published + " by " + selector);
  }
}

TEST_F(VerdictTest, ALineUnderANewIdentifierIsHitByTheOldOneToo) {
  for (const char* route : {"old", "r1"}) {
    setFileDate(folder.write("alerts.pb", kHeader + alertEntity(kTitle + selectorOf(field(2, route)))), kNow);
    EXPECT_EQ(verdictOn("old", "1"), "affected: T") << route;
    EXPECT_EQ(verdictOn("r2", "2"), "good") << route;
  }
  // Until another line has it.
  folder.write("feed/routes.txt", "route_id,agency_id,route_short_name,route_type\nr1,A,1,0\n old,A,9,0\n");
  setFileDate(folder.write("alerts.pb", kHeader + alertEntity(kTitle + selectorOf(field(2, "old")))), kNow);
  EXPECT_EQ(verdict(), "good");
}

TEST_F(ServedVerdictTest, ACompressedAnswerWithoutItsTrailerIsCutOff) {
  const std::string packed = gzip(feedBytes("")), head = "200 OK\r\nContent-Encoding: gzip";
  const auto with = [&](std::size_t fromEnd, char c) {
    std::string bytes = packed;
    bytes[bytes.size() - fromEnd] = c;
    return bytes;
  };
  const std::pair<const char*, std::string> broken[] = {{"no trailer", packed.substr(0, packed.size() - 8)},
                                                        {"half of it", packed.substr(0, packed.size() - 1)},
                                                        {"another length", with(4, '?')},
                                                        {"another sum", with(8, '?')},
                                                        {"more behind it", packed + "?"},
                                                        {"nothing", ""},
                                                        {"not packed", feedBytes("")}};
  for (const auto& [what, body] : broken) EXPECT_EQ(verdictBy(head, body), unknown(Code::cutOff)) << what;
  EXPECT_EQ(verdictBy("200 OK\r\nContent-Encoding: br", packed), unknown(Code::serverFailure));
  EXPECT_EQ(verdictBy(head, packed), "good");
  EXPECT_EQ(verdictBy(head, packed + gzip(feedBytes(alert("a", "T", route("r1"))))), "affected: T");
}

TEST_F(VerdictTest, EntitiesOfWhichNoneIsAnAlertAreAnotherFeeds) {
  const std::string deleted = entity(field(1, "x") + "\x10\x01" + field(5, kTitle + kRoute));
  for (const std::string& others : {kVehicle, kTripUpdate, kVehicle + kTripUpdate}) {
    feed.isCombined = false;
    EXPECT_EQ(verdictBy(kHeader + others), unknown(Code::otherFeed));
    EXPECT_EQ(verdictBy(kHeader + others + alertEntity(kTitle + kRoute)), "affected: T");
    EXPECT_EQ(verdictBy(kHeader + others + deleted), "good");
    feed.isCombined = true;
    EXPECT_EQ(verdictBy(kHeader + others), "good");
  }
}

TEST_F(VerdictTest, AlertsThatNameOnlyForeignRoutesDoNotBelong) {
  const std::string later = "active_period { start: " + std::to_string(kNow + 5) + " } ";
  const std::string two = route("x") + route("y"), three = two + route("z");
  const std::pair<std::string, std::string> cases[] = {
      {alert("a", "T", three), unknown(Code::foreignAlerts)},
      {alert("a", "T", two) + alert("b", "T", "informed_entity { trip { route_id: 'z' } }"),
       unknown(Code::foreignAlerts)},
      {alert("a", "T", two + route("x")), "good"},
      {alert("a", "T", three + later), "good"},
      {alert("a", "T", three) + alert("b", "T", route("r2")), "good"},
  };
  for (const auto& [entities, expected] : cases) EXPECT_EQ(verdictBy(feedBytes(entities)), expected) << entities;
  setFileDate(folder.write("alerts.pb", feedBytes(cases[0].first)), kNow);
  EXPECT_EQ(checkFeed(feed, FeedCache(paths.cache)).faults().at(0)->code(),
            static_cast<std::int64_t>(Code::foreignAlerts));
}

TEST_F(VerdictTest, ALocalFileGrowsOld) {
  constexpr std::uint64_t kHour = 3600;
  const std::tuple<std::optional<int>, std::uint64_t, bool> cases[] = {{{}, 23 * kHour, true},
                                                                       {{}, 25 * kHour, false},
                                                                       {60, 2 * kHour, false},
                                                                       {60, kHour / 2, true},
                                                                       {0, 10'000 * kHour, true}};
  for (const auto& [minutes, age, isGood] : cases)
    for (const bool isDated : {true, false}) {
      feed.maximumAlertsAge.reset();
      if (minutes) feed.maximumAlertsAge = std::chrono::minutes(*minutes);
      const auto path = folder.write("alerts.pb", isDated ? feedBytes("", kNow - age) : kHeader);
      setFileDate(path, isDated ? kNow : kNow - age);
      EXPECT_EQ(verdict(), isGood ? "good" : unknown(Code::staleAlerts)) << age << isDated;
      EXPECT_EQ(checkFeed(feed, FeedCache(paths.cache)).faults().empty(), isGood);
    }
}

TEST_F(ServedVerdictTest, AFeedWithoutATimestampIsAgedByWhatIsKnownOfIt) {
  const std::string modified = "200 OK\r\nLast-Modified: ", changed = kHeader + alertEntity(kTitle + kRoute);
  EXPECT_EQ(verdictBy(modified + "Sat, 07 Jun 2025 15:06:40 GMT", kHeader), unknown(Code::staleAlerts));
  EXPECT_EQ(verdictBy(modified + "Mon, 09 Jun 2025 15:06:40 GMT", kHeader), "good");
  for (const char* other : {"200 OK", "200 OK\r\nLast-Modified: yesterday"}) {
    EXPECT_EQ(verdictBy(other, changed), "affected: T");
    EXPECT_EQ(verdictBy(other, kHeader), "good");
    platform.time.advance(6 * 86400);
    EXPECT_EQ(verdictBy(other, kHeader), "good");
    platform.time.advance(2 * 86400);
    EXPECT_EQ(verdictBy(other, kHeader), unknown(Code::staleAlerts)) << "the same bytes for eight days";
  }
}

TEST_F(VerdictTest, ASingleAgencyIsMeantByTheOnlyOneThatIsNamed) {
  const std::string other = "informed_entity { agency_id: 'Z' } ";
  const std::pair<std::string, std::string> cases[] = {
      {alert("a", "T", other) + alert("b", "U", "informed_entity { agency_id: 'Z' route_id: 'r2' }"), "affected: T"},
      {alert("a", "T", other + "informed_entity { agency_id: 'Y' }"), "good"},
      {alert("a", "T", other) + alert("b", "U", route("r2")), "good"},
  };
  for (const auto& [entities, expected] : cases) EXPECT_EQ(verdictBy(feedBytes(entities)), expected) << entities;
  folder.write("feed/agency.txt", "agency_id,agency_name\nA,Trams\nB,Boats\n");
  EXPECT_EQ(verdictBy(feedBytes(cases[0].first)), "good");
}

TEST_F(ServedVerdictTest, NoAlertsAreOlderThanThoseHeld) {
  feed.maximumAlertsAge = std::chrono::minutes(60 * 24 * 30);
  EXPECT_EQ(verdictBy("200 OK", feedBytes("", kNow - 60)), "good");
  platform.time.advance(20 * 3600);
  EXPECT_EQ(verdictBy("200 OK", feedBytes("", kNow - 120)), unknown(Code::staleAlerts));
  EXPECT_EQ(verdictBy("200 OK", feedBytes("", kNow + 30 * 3600)), "good");  // the clock says 20 hours
  // Not what is held, which would stand in for an answer that is refused.
  EXPECT_EQ(verdictBy("200 OK", feedBytes("", kNow + 19 * 3600) + alertEntity(kTitle + kRoute)), "affected: T");
}

}  // namespace
}  // namespace nimbo
