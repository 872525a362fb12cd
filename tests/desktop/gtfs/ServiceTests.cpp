#include <condition_variable>
#include <future>

#include "desktop/gtfs/Fixtures.h"
#include "desktop/gtfs/LoopbackServer.h"
#include "desktop/gtfs/feeds/FeedCatalog.h"
#include "desktop/gtfs/feeds/FeedCheck.h"
#include "desktop/gtfs/feeds/FeedMuid.h"
#include "desktop/gtfs/feeds/GTFSTransitLineService.h"
#include "desktop/gtfs/feeds/SampleCity.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "platform/DueAnswer.h"
#include "support/NoThreads.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using Code = TransitLineServiceError;

const std::string kLine1 = "route_id,route_short_name\nr1,1\n";

class LineServiceTest : public testing::Test {
 protected:
  LineServiceTest() { platform.time.setNow(dateFromUnixTime(kNow)); }

  /// Sets up a feed of lines r1, r2... with these short names.
  void addFeed(const std::string& name, const std::vector<std::string>& shortNames, const std::string& alerts) {
    std::string routes = "route_id,route_short_name,route_type\n";
    for (std::size_t i = 0; i < shortNames.size(); ++i)
      routes += "r" + std::to_string(i + 1) + "," + shortNames[i] + ",3\n";
    folder.write(name + "/routes.txt", routes);
    ASSERT_FALSE(FeedConfiguration(paths.config)
                     .add({name, *FeedAddress::parse((folder.path() / name).native()), *FeedAddress::parse(alerts)}));
  }
  void addFeed(const std::string& name, const std::vector<std::string>& shortNames) {
    addFeed(name, shortNames, folder.write(name + "/alerts.pb", feedBytes(alert("a", "In " + name, route("r1")))));
  }
  /// Sets up "city", whose static feed comes from this address, and whose line r1 has an incident "T".
  void addServedFeed(const std::string& staticFeed) {
    const std::string alerts = folder.write("city.pb", feedBytes(alert("a", "T", route("r1"))));
    ASSERT_FALSE(FeedConfiguration(paths.config)
                     .add({.name = "city",
                           .staticFeed = *FeedAddress::parse(staticFeed),
                           .alerts = *FeedAddress::parse(alerts),
                           .maximumAlertsAge = std::chrono::minutes(0)}));  // however far a test's time goes
  }
  static MapItemIdentifierRef line(const std::string& feed, const std::string& routeID,
                                   const std::string& shortName = "") {
    return std::make_shared<const MapItemIdentifier>(
        lineMuid(feed, routeID), TransitLineLocator{feed, "", routeID, shortName, TransitMode::bus});
  }

  std::pair<TransitLineItems, ErrorRef> ask(const std::vector<MapItemIdentifierRef>& identifiers) {
    std::optional<std::pair<TransitLineItems, ErrorRef>> answer;
    service->lookup(identifiers,
                    [&](const TransitLineItems& items, const ErrorRef& error) { answer.emplace(items, error); });
    EXPECT_FALSE(answer);
    platform.loop.waitAndDrain([&] { return answer.has_value(); });
    return *answer;
  }
  /// The names of the lines, each with the titles of its incidents, or the error's code.
  std::string lookup(const std::vector<MapItemIdentifierRef>& identifiers) {
    const auto [items, error] = ask(identifiers);
    std::string text;
    if (error) {
      EXPECT_EQ(error->domain(), kTransitLineServiceErrorDomain);
      EXPECT_TRUE(items.empty());
      text = "error " + std::to_string(error->code());
    }
    for (const auto& item : items) {
      text += item->name().value_or("?");
      for (const auto& incident : item->incidents()) text += " (" + *incident->title() + ")";
      text += "; ";
    }
    return text;
  }
  static std::string error(Code code) { return "error " + std::to_string(static_cast<int>(code)); }

  TestPlatform platform;
  TemporaryFolder folder;
  Paths paths = Paths::resolve(folder.path() / "config", folder.path() / "state");
  std::unique_ptr<GTFSTransitLineService> service = std::make_unique<GTFSTransitLineService>(paths);
};

TEST_F(LineServiceTest, AnswersInTheOrderOfTheIdentifiers) {
  addFeed("north", {"1", "2"});
  addFeed("south", {"1", "3"});
  EXPECT_EQ(lookup({line("south", "r2"), line("north", "r1"), line("south", "r1"),
                    std::make_shared<const MapItemIdentifier>(lineMuid("north", "r2"))}),
            "3; 1 (In north); 1 (In south); 2; ");
  EXPECT_EQ(lookup({}), "");
}

TEST_F(LineServiceTest, KeepsTheObjectsOfWhatHasNotChanged) {
  const auto publish = [&](const std::string& second, std::uint64_t time = kNow) {
    return folder.write(
        "north/alerts.pb",
        feedBytes(alert("a", "A", route("r1")) + alert("b", "B", route("r2")) + alert("c", second, route("r2")), time));
  };
  addFeed("north", {"1", "2"}, publish("C"));
  const auto items = [&](const std::vector<MapItemIdentifierRef>& identifiers) { return ask(identifiers).first; };
  const TransitLineItems first = items({line("north", "r1"), line("north", "r2")});
  EXPECT_EQ(items({line("north", "r1"), line("north", "r2")}), first) << "the same bytes";
  publish("C", kNow + 1);
  EXPECT_EQ(items({line("north", "r1"), line("north", "r2")}), first) << "the same alerts";
  publish("changed");
  const TransitLineItems changed = items({line("north", "r1"), line("north", "r2")});
  EXPECT_EQ(changed[0], first[0]);
  EXPECT_NE(changed[1], first[1]);
  EXPECT_EQ(changed[1]->incidents()[0], first[1]->incidents()[0]);
  EXPECT_EQ(changed[1]->incidents()[1]->title(), "changed");
  EXPECT_EQ(items({line("north", "r2")})[0]->incidents(), changed[1]->incidents()) << "another question";
  service->setLanguage("de");
  EXPECT_EQ(lookup({line("north", "r2")}), "2 (B) (changed); ");
  folder.write("north/routes.txt", "route_id,route_short_name,route_type\nr2,two,3\n");
  EXPECT_EQ(lookup({line("north", "r2")}), "two (B) (changed); ") << "another static feed";
}

TEST_F(LineServiceTest, ReadsTheSameBytesAgainWhenWhatTheyMeanChanges) {
  const std::string start = "active_period { start: " + std::to_string(kNow + 3600) + " } ";
  addFeed("north", {"1"},
          folder.write("alerts.pb", feedBytes(alert("a", "A", route("r1")) +
                                              alert("b", "B", start + "informed_entity { trip { trip_id: 'x' } }"))));
  EXPECT_EQ(lookup({line("north", "r1")}), "1 (A); ");
  platform.time.advance(3599);
  EXPECT_EQ(lookup({line("north", "r1")}), "1 (A); ");
  platform.time.advance(1);
  EXPECT_EQ(lookup({line("north", "r1")}), error(Code::tripsMissing)) << "an alert by trip comes in force";
}

TEST_F(LineServiceTest, FailsWhenAFeedDoes) {
  addFeed("north", {"1"});
  addFeed("south", {"1"}, folder.path() / "missing.pb");
  EXPECT_EQ(lookup({line("north", "r1")}), "1 (In north); ");
  EXPECT_EQ(lookup({line("north", "r1"), line("south", "r1")}), error(Code::unreadableFile));
  ASSERT_EQ(service->knownIncidents().size(), 1u) << "what the other feed says stays known";
  EXPECT_EQ(service->knownIncidents()[0].title, "In north");
  EXPECT_EQ(lookup({line("north", "r1"), line("east", "r1")}), error(Code::unknownFeed));
  EXPECT_EQ(service->knownIncidents().size(), 1u) << "a feed that is not set up hides nothing either";
  std::string many;
  for (int i = 0; i <= 5000; ++i) many += alert(std::to_string(i), "T" + std::to_string(i), route("r1"));
  addFeed("west", {"1"}, folder.write("many.pb", feedBytes(many)));
  EXPECT_EQ(lookup({line("west", "r1")}), error(Code::tooLarge));
  folder.write("config/feeds.json", "{");
  EXPECT_EQ(lookup({line("north", "r1")}), error(Code::configuration));
}

TEST_F(LineServiceTest, FindsRenumberedLinesAndNamesThoseThatAreGone) {
  addFeed("north", {"1", "2", "5", "5"});
  const auto renumbered = line("north", "old-2", "2");
  EXPECT_EQ(lookup({renumbered, line("north", "gone", "9"), line("north", "old-5", "5"), line("north", "r1")}),
            "2; 1 (In north); ");
  ASSERT_EQ(service->goneLines().size(), 2u);
  EXPECT_EQ(service->goneLines()[0]->locator()->routeID, "gone");
  EXPECT_EQ(service->goneLines()[1]->locator()->routeID, "old-5");
  EXPECT_EQ(platform.log.texts("TransitLineService", LogLevel::error).size(), 2u);
  EXPECT_EQ(lookup({line("north", "gone", "9")}), error(Code::unknownLine));
  const auto item = ask({renumbered}).first.at(0);
  EXPECT_EQ(item->muid(), renumbered->muid()) << "the favorite's own number";
  EXPECT_EQ(item->identifier()->locator()->routeID, "r2");
}

TEST_F(LineServiceTest, AsksAllServersAtTheSameTime) {
  std::mutex lock;
  std::condition_variable arrived;
  int count = 0;
  const LoopbackServer server([&](const std::string&) {
    std::unique_lock guard(lock);
    ++count;
    arrived.notify_all();
    arrived.wait(guard, [&] { return count == 2; });
    return LoopbackServer::Answer{LoopbackServer::answer("200 OK", feedBytes(""))};
  });
  addFeed("north", {"1"}, server.address("/north"));
  addFeed("south", {"2"}, server.address("/south"));
  EXPECT_EQ(lookup({line("north", "r1"), line("south", "r1")}), "1; 2; ");
}

TEST_F(LineServiceTest, AnswersWithAnErrorWhenNoThreadStarts) {
  addFeed("north", {"1"});
  const NoThreads noThreads;
  EXPECT_EQ(lookup({line("north", "r1")}), error(Code::internal));
}

/// A server that keeps an answer back until it may go on.
struct HeldBack {
  std::promise<void> promise;
  std::shared_future<void> mayGoOn = promise.get_future();
};

TEST_F(LineServiceTest, AnswersWithinAMinuteAndTheNextLookupJoinsTheDownload) {
  HeldBack archive;
  const LoopbackServer server([&](const std::string&) {
    platform.loop.wake();
    archive.mayGoOn.wait();
    return LoopbackServer::Answer{LoopbackServer::answer("200 OK\r\nETag: \"a\"", zipOfRoutes(kLine1))};
  });
  addServedFeed(server.address());
  std::vector<ErrorRef> errors;
  const auto ask = [&] {
    service->lookup({line("city", "r1")}, [&](const auto&, const ErrorRef& error) { errors.push_back(error); });
  };
  ask();
  platform.loop.waitAndDrain([&] { return !server.requests().empty(); });
  platform.time.advance(DueAnswer::kPatience - 1);
  EXPECT_TRUE(errors.empty());
  platform.time.advance(1);
  ASSERT_EQ(errors.size(), 1u);
  EXPECT_EQ(errors[0]->code(), static_cast<int>(Code::downloading));
  EXPECT_EQ(errors[0]->subject(), "city (0 MiB)");
  ask();
  archive.promise.set_value();
  platform.loop.waitAndDrain([&] { return errors.size() == 2; });
  EXPECT_EQ(errors[1], nullptr);
  EXPECT_EQ(server.requests().size(), 1u);
}

TEST_F(LineServiceTest, DoesNotWaitForAStaticServerOnceThereIsACache) {
  HeldBack first, second;
  std::atomic<HeldBack*> silence = nullptr;
  std::atomic<std::size_t> asked = 0;
  const LoopbackServer server([&](const std::string&) {
    HeldBack* const held = silence;
    ++asked;
    platform.loop.wake();
    if (!held) return LoopbackServer::Answer{LoopbackServer::answer("200 OK\r\nETag: \"a\"", zipOfRoutes(kLine1))};
    held->mayGoOn.wait();
    return LoopbackServer::Answer{};
  });
  addServedFeed(server.address());
  EXPECT_EQ(lookup({line("city", "r1")}), "1 (T); ");
  std::size_t requests = 1;
  const auto isAskedAfter = [&](TimeInterval later) {
    service = std::make_unique<GTFSTransitLineService>(paths);  // what the old one learned is kept
    platform.time.advance(later);
    EXPECT_EQ(lookup({line("city", "r1")}), "1 (T); ");
    const bool isAsked = !service->library().downloads().underWay().empty();
    requests += isAsked ? 1 : 0;
    platform.loop.waitAndDrain([&] { return asked >= requests; });
    EXPECT_NE(server.requests().back().find("If-None-Match: \"a\""), std::string::npos);
    EXPECT_EQ(service->library().downloads().firstUnderWay(), nullptr) << "nobody waits for it";
    return isAsked;
  };
  // The server is silent from now on. It is asked after a day, then after 15 minutes, 30, an hour.
  silence = &first;
  for (const auto& [later, isAsked] :
       {std::pair{86400, true}, {899, false}, {1, true}, {1799, false}, {1, true}, {3599, false}, {1, true}})
    EXPECT_EQ(isAskedAfter(later), isAsked) << later;
  // One that answers again is asked as at first.
  first.promise.set_value();
  silence = nullptr;
  service = std::make_unique<GTFSTransitLineService>(paths);
  platform.time.advance(7200);
  EXPECT_EQ(lookup({line("city", "r1")}), "1 (T); ");
  while (!service->library().downloads().underWay().empty()) std::this_thread::yield();
  requests = asked;
  silence = &second;
  EXPECT_FALSE(isAskedAfter(86399));
  EXPECT_TRUE(isAskedAfter(1));
  EXPECT_TRUE(isAskedAfter(900));
  second.promise.set_value();
}

TEST_F(LineServiceTest, ReadsTheAlertsAgainForAStaticFeedWhoseServerDoesNotTellItsState) {
  std::atomic<bool> isNew = false;
  const LoopbackServer server([&](const std::string&) {
    return LoopbackServer::Answer{
        LoopbackServer::answer("200 OK", zipOfRoutes(isNew ? "route_id,route_short_name\nr1,one\n" : kLine1))};
  });
  addServedFeed(server.address());
  EXPECT_EQ(lookup({line("city", "r1")}), "1 (T); ");
  isNew = true;
  platform.time.advance(86400);
  EXPECT_EQ(lookup({line("city", "r1")}), "1 (T); ");
  while (!service->library().downloads().underWay().empty()) std::this_thread::yield();
  EXPECT_EQ(lookup({line("city", "r1")}), "one (T); ");
}

TEST_F(LineServiceTest, NeverCallsBackOnceItIsGone) {
  std::mutex lock;
  lock.lock();
  bool isAsked = false;
  {
    const LoopbackServer server([&](const std::string&) {
      platform.loop.dispatchAsync([&] { isAsked = true; });
      const std::lock_guard untilTheEnd(lock);
      return LoopbackServer::Answer{};
    });
    addFeed("north", {"1"}, server.address());
    service->lookup({line("north", "r1")}, [](const auto&, const auto&) { FAIL(); });
    platform.loop.waitAndDrain([&] { return isAsked; });
    service.reset();
    lock.unlock();
  }
  platform.loop.runUntilIdle();
}

TEST_F(LineServiceTest, ServesTheSampleCityUntilAFeedIsSetUp) {
  std::vector<MapItemIdentifierRef> favorites;
  for (const auto& favorite : SampleCity::favorites()) favorites.push_back(favorite->identifier());
  service->setLanguage("de-AT");
  const std::string before = lookup(favorites);
  EXPECT_TRUE(before.starts_with("M1 (Verspätungen bis zu 15 Minuten); M2 (Verspätungen bis zu 15 Minuten); "))
      << before;
  platform.time.advance(1000);
  EXPECT_EQ(lookup(favorites), before);
  addFeed("north", {"1"});
  EXPECT_EQ(lookup(favorites), error(Code::unknownFeed));
}

TEST_F(LineServiceTest, CatalogPutsTheNearestLinesFirst) {
  folder.write("city/agency.txt", "agency_id,agency_name\nM,Alameda Metro\nB,Autobusi Sofia\n");
  folder.write("city/routes.txt",
               "route_id,agency_id,route_short_name,route_long_name,route_type\n"
               "r1,M,10,Harbour Line,1\nr2,M,1,Grand Harbour,1\nr3,M,A,Castle,1\nr4,B,BA,Ring – Витоша,3\n"
               "r5,B,,Züri Älpli,3\nr6,B,X1,Ångström,3\n");
  ASSERT_FALSE(
      FeedConfiguration(paths.config)
          .add({"city", *FeedAddress::parse((folder.path() / "city").native()), *FeedAddress::parse("/none")}));
  const FeedLibrary library(paths);
  FeedCatalog catalog(library);
  const std::pair<const char*, const char*> cases[] = {
      {"", "r1 r2 r3 r4 r5 r6"},
      {"A", "r3 r6 r5 r1 r2 r4"},  // itself, a name's beginning, a word's, within names
      {"1", "r2 r1 r6"},
      {"витоша", "r4"},
      {" line  HARBOUR ", "r1"},
      {"harbour", "r1 r2"},
      {"zuri", "r5"},
      {"alameda 1", "r2 r1"},
      {"sofia ring", "r4"},
      {"CITY:r2", "r2"},
      {"city:r", "r1 r2 r3 r4 r5 r6"},
      {"r6", "r6"},
      {"town:r2", ""},
      {"harbour castle", ""},
  };
  for (const auto& [text, expected] : cases) {
    std::string found;
    const auto hits = catalog.find({.text = text, .limit = 100});
    for (const auto& [line, longName] : hits->lines)
      found += (found.empty() ? "" : " ") + line->identifier()->locator()->routeID;
    EXPECT_EQ(found, expected) << text;
  }
  const auto rest = catalog.find({.text = "A", .offset = 4, .limit = 1});
  EXPECT_EQ(rest->total, 6u);
  EXPECT_EQ(rest->lines.at(0).line->identifier()->locator()->routeID, "r2");
  folder.write("city/routes.txt", "route_id,route_short_name,route_type\nr7,A,1\n");
  EXPECT_EQ(catalog.find({.text = "a", .limit = 9})->total, 1u) << "not what was kept of the feed before";
}

}  // namespace
}  // namespace nimbo
