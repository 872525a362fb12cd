#include <gmock/gmock.h>

#include <cstdlib>
#include <set>

#include "desktop/archive/Bzip2.h"
#include "desktop/gtfs/Fixtures.h"
#include "desktop/gtfs/LoopbackServer.h"
#include "desktop/gtfs/alerts/AlertsStore.h"
#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/feeds/FeedLibrary.h"
#include "desktop/gtfs/feeds/FeedSetup.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/StaticFeedStore.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using Answer = LoopbackServer::Answer;
using Code = TransitLineServiceError;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

/// A folder of the user's data, with a catalog that stands in for the one shipped.
class OwnCatalog {
 public:
  OwnCatalog() { ::setenv("XDG_DATA_HOME", folder.path().c_str(), 1); }
  ~OwnCatalog() { ::unsetenv("XDG_DATA_HOME"); }
  void write(const std::string& feeds) const {
    const std::string text = R"({"version": 1, "feeds": [)" + feeds + "]}";
    const auto packed =
        Bzip2Compressor().Bzip2Compress({reinterpret_cast<const std::uint8_t*>(text.data()), text.size()});
    writeBytes({packed->begin(), packed->end()});
  }
  void writeBytes(const std::string& bytes) const { folder.write("nimbo-transit/feed-catalog.json.bz2", bytes); }

  TemporaryFolder folder;
};

std::string entry(const std::string& id, const std::string& alerts, const std::vector<std::string>& statics,
                  const std::string& more = "", const std::string& key = "") {
  std::string files;
  for (const std::string& url : statics)
    files += (files.empty() ? "" : ",") + (R"({"url": ")" + url + "\"" + key + "}");
  return R"({"id": ")" + id + R"(", "provider": "Agency )" + id + R"(", "alerts": {"url": ")" + alerts + "\"" + key +
         R"(}, "static": [)" + files + "]" + more + "}";
}

std::vector<std::string> idsOf(const std::vector<KnownFeed>& feeds) {
  std::vector<std::string> ids;
  for (const KnownFeed& feed : feeds) ids.push_back(feed.id);
  return ids;
}

TEST(KnownFeeds, AreFoundByAgencyNameIdentifierAndPlace) {
  const auto known = KnownFeeds::read();
  ASSERT_TRUE(known) << known.error()->reason();
  EXPECT_GT(known->all().size(), 500u);
  std::set<std::string> ids, looks;
  for (const KnownFeed& feed : known->all()) {
    EXPECT_TRUE(ids.insert(feed.id).second) << feed.id;
    EXPECT_TRUE(looks.insert(feed.title() + feed.municipality + feed.subdivision).second) << feed.title();
    EXPECT_FALSE(feed.country.empty()) << feed.id;
    EXPECT_LT(feed.provider.size(), 120u) << feed.id;
    EXPECT_FALSE(FeedConfiguration::checkName(nameForFeed(feed, {}))) << feed.id;
  }
  const char* const cases[][3] = {{"TRIMET", "en", "1709"},
                                  {"portland trimet", "en", "1709"},
                                  {"krakow ztp bus", "en", "2599"},
                                  {"Lviv", "en", "f-u8c5-lvivavtodor~rt"},
                                  {"ЛЬВІВ", "en", "f-u8c5-lvivavtodor~rt"},
                                  {"f-u1-delijn~rt", "en", "f-u1-delijn~rt"},
                                  {"ungarn", "de", "2672"},
                                  {"budapest hungary", "ja", "2672"}};
  for (const auto& [text, locale, first] : cases) {
    const auto found = known->matching(text, locale);
    ASSERT_FALSE(found.empty()) << text;
    EXPECT_EQ(found.front().id, first) << text;
  }
  EXPECT_TRUE(known->matching("trimet budapest", "en").empty());
  EXPECT_EQ(known->matching("", "en").size(), known->all().size());
  std::vector<std::string> countries;
  for (const auto& country : known->countries("fr")) countries.push_back(country.name);
  const auto states = std::ranges::find(countries, "États-Unis");
  ASSERT_NE(states, countries.end());
  EXPECT_LT(*(states - 1), "F");
  EXPECT_GE(*(states + 1), "F");
  EXPECT_EQ(nameForFeed(*known->withID("2655"), {}), "ptv");
  EXPECT_EQ(known->keyFor(*FeedAddress::parse("https://developer.trimet.org/ws/V1/FeedSpecAlerts/?a=b"))->name,
            "AppID");
  EXPECT_EQ(known->withID("none").error()->code(), static_cast<int>(Code::unknownCatalogFeed));
}

TEST(KnownFeeds, SaysWhatIsWrongWithACatalogThatCannotBeUsed) {
  const OwnCatalog own;
  own.write(entry("1", "http://h/a", {"http://h/s"}));
  EXPECT_THAT(idsOf(KnownFeeds::read()->all()), ElementsAre("1"));
  for (const std::string& feed :
       {entry("1", "ftp://h/a", {"http://h/s"}), entry("1", "http://h/a", {}), std::string("{}"), std::string("3"),
        std::string("]"), entry("1", "http://h/a", {"http://h/s"}, "", R"(, "key": {"in": "body", "name": "k"})")}) {
    own.write(feed);
    const auto read = KnownFeeds::read();
    ASSERT_FALSE(read) << feed;
    EXPECT_EQ(read.error()->code(), static_cast<int>(Code::badCatalog)) << feed;
    EXPECT_THAT(read.error()->reason(), HasSubstr("feed-catalog.json.bz2"));
  }
  own.writeBytes("BZh9 not");
  EXPECT_EQ(KnownFeeds::read().error()->code(), static_cast<int>(Code::badCatalog));
}

/// A server that wants a key and a user's password, and the catalog that says so.
class KeyedFeedTest : public testing::Test {
 protected:
  void know(const std::string& place, const std::string& name) {
    const std::string user = "http://user:word@" + server.address("").substr(std::string("http://").size());
    own.write(
        entry("1", user + "/alerts", {user + "/static"}, "",
              R"(, "key": {"in": ")" + place + R"(", "name": ")" + name + R"(", "page": "https://k.example/get"})"));
  }
  Feed feed(const std::string& key) { return feedsOf(*KnownFeeds::read()->withID("1"), "city", key).front(); }
  std::string fetch(const Feed& feed) {
    AlertsState state;
    const auto alerts = AlertsStore(FeedCache(folder.path() / "cache")).fetch(feed, state, true, {});
    const auto lines = StaticFeedStore(FeedCache(folder.path() / "cache")).readAnew(feed, {});
    return !alerts ? alerts.error()->reason() : !lines ? lines.error()->reason() : "";
  }

  TestPlatform platform;
  OwnCatalog own;
  TemporaryFolder folder;
  std::string wanted;    // in each request
  std::string location;  // of a redirect, for requests with the key; empty without
  LoopbackServer server{[this](const std::string& request) {
    if (request.find(wanted) == std::string::npos) return Answer{LoopbackServer::answer("401 Unauthorized", "")};
    if (!location.empty() && request.find("/moved") == std::string::npos)
      return Answer{LoopbackServer::answer("302 Found\r\nLocation: " + location, "")};
    return Answer{LoopbackServer::answer(
        "200 OK", request.find("/static") == std::string::npos ? feedBytes("") : zipOfRoutes("route_id\n1\n"))};
  }};
};

TEST_F(KeyedFeedTest, PutsItsKeyIntoTheQueryAndKeepsItApart) {
  know("query", "acl:key");
  wanted = "?acl:key=a%20b%26c ";
  FeedConfiguration configuration(folder.path() / "config");
  ASSERT_FALSE(configuration.add(feed("a b&c")));
  const auto kept = configuration.feedNamed("city");
  EXPECT_EQ(*kept, feed("a b&c"));
  EXPECT_EQ(fetch(*kept), "");
  EXPECT_THAT(folder.read("config/feeds.json"), Not(HasSubstr("acl:key")));
  for (const auto& file : std::filesystem::directory_iterator(folder.path() / "cache"))
    EXPECT_THAT(*readFile(file.path(), 1 << 20), Not(HasSubstr("acl:key")));
  EXPECT_THAT(fetch(feed("wrong")),
              testing::AllOf(HasSubstr("https://k.example/get"), HasSubstr("acl:key"), Not(HasSubstr("wrong"))));
  ASSERT_FALSE(configuration.remove("city"));
  EXPECT_THAT(folder.read("config/keys.json"), Not(HasSubstr("acl:key")));
}

TEST_F(KeyedFeedTest, TakesItsKeyToItsOwnServerAlone) {
  know("header", "X-Key");
  wanted = "X-Key: s3cret";
  const auto isWithSecrets = [](const std::string& request) {
    return request.find("s3cret") != std::string::npos && request.find("Authorization: ") != std::string::npos;
  };
  location = "/moved/static";
  EXPECT_THAT(fetch(feed("s3cret")), Not(HasSubstr("status 401"))) << "the server's own redirect keeps the key";
  EXPECT_TRUE(isWithSecrets(server.requests().back()));
  const LoopbackServer other(
      [](const std::string&) { return Answer{LoopbackServer::answer("200 OK", feedBytes(""))}; });
  const LoopbackServer back([&](const std::string&) {
    return Answer{LoopbackServer::answer("302 Found\r\nLocation: " + server.address("/moved"), "")};
  });
  const std::string port = server.address().substr(std::string("http://127.0.0.1").size());
  for (const std::string& to : {other.address(), back.address(), "http://localhost" + port + "moved"}) {
    location = to;
    const std::size_t before = server.requests().size();
    fetch(feed("s3cret"));
    const auto requests = server.requests();
    EXPECT_EQ(std::count_if(requests.begin() + static_cast<std::ptrdiff_t>(before), requests.end(), isWithSecrets), 2)
        << to << ": the first request for each half";
  }
  EXPECT_FALSE(other.requests().empty());
  for (const auto* strange : {&other, &back})
    for (const std::string& request : strange->requests())
      for (const char* secret : {"s3cret", "Authorization", "word", "Referer"})
        EXPECT_THAT(request, Not(HasSubstr(secret)));
}

TEST(FeedKey, TakesOnlyHeadersThatCanBeSent) {
  for (const char* good : {"a: b", "Authorization:Bearer x", "x-Y_1: a\tb"})
    EXPECT_FALSE(FeedKey::checkHeader(good)) << good;
  for (const char* bad : {"", "a", ": b", "a b: c", "a:", "a: ", "a: b\r\nHost: c", "a: b\n", "ä: b", "a: \x7F"})
    EXPECT_TRUE(FeedKey::checkHeader(bad)) << bad;
}

TEST(FeedConfiguration, KeepsQueriesOfAddressesApartAndTellsOfBrokenKeys) {
  const TemporaryFolder folder;
  FeedConfiguration configuration(folder.path());
  const Feed feed{"a", FeedAddress::parse("http://h/s?agency=1&key=x#f")->withQueryAsKey(), *FeedAddress::parse("/b")};
  EXPECT_EQ(feed.staticFeed.textWithKey(), "http://h/s?agency=1&key=x");
  EXPECT_EQ(feed.staticFeed.publicText(), "http://h/s?...");
  ASSERT_FALSE(configuration.add(feed));
  EXPECT_THAT(folder.read("feeds.json"), Not(HasSubstr("key=x")));
  EXPECT_EQ(*configuration.feedNamed("a"), feed);
  Feed changed = feed;
  changed.minorAlerts = true;
  changed.staticFeed = *FeedAddress::parse("http://h/other");
  ASSERT_FALSE(configuration.replace(changed));
  EXPECT_EQ(*configuration.feedNamed("a"), changed);
  EXPECT_THAT(folder.read("keys.json"), Not(HasSubstr("key=x")));
  changed.name = "none";
  EXPECT_TRUE(configuration.replace(changed));
  for (const char* broken :
       {"[]", "{", R"({"keys": 3})", R"({"keys": {"a": {"static": {"headers": ["a: b\r\nc: d"]}}}})",
        R"({"keys": {"a": {"static": {"headers": 3}}}})", R"({"keys": {"a": {"static": {"query": "a b"}}}})"}) {
    folder.write("keys.json", broken);
    const std::string before = folder.read("feeds.json");
    ASSERT_FALSE(configuration.feeds()) << broken;
    EXPECT_THAT(configuration.feeds().error()->reason(), HasSubstr("keys.json"));
    EXPECT_TRUE(configuration.remove("a"));
    EXPECT_EQ(folder.read("feeds.json"), before);
    EXPECT_EQ(folder.read("keys.json"), broken);
  }
}

TEST(KnownFeeds, OfSeveralPartsFetchTheirAlertsOnce) {
  TestPlatform platform;
  const OwnCatalog own;
  platform.time.setNow(dateFromUnixTime(kNow));
  const LoopbackServer server([](const std::string& request) {
    if (request.find("/alerts") != std::string::npos)
      return Answer{
          LoopbackServer::answer("200 OK", feedBytes(alert("1", "T", route("x1") + route("x2") + route("x3"))))};
    if (request.find("/gone") != std::string::npos) return Answer{LoopbackServer::answer("404 Gone", "")};
    return Answer{LoopbackServer::answer(
        "200 OK", zipOfRoutes(request.find("/one") != std::string::npos ? "route_id\n1\n" : "route_id\nx1\n"))};
  });
  own.write(entry("1", server.address("/alerts"), {server.address("/one"), server.address("/gone")}));
  Feed other = feedsOf(*KnownFeeds::read()->withID("1"), "city", "").at(1);
  EXPECT_EQ(other.name, "city-2");
  other.staticMirror = *FeedAddress::parse(server.address("/mirror"));
  FeedConfiguration configuration(own.folder.path() / "config");
  ASSERT_FALSE(configuration.add(feedsOf(*KnownFeeds::read()->withID("1"), "city", "").at(0)));
  ASSERT_FALSE(configuration.add(other));

  const FeedLibrary library({own.folder.path() / "config", own.folder.path() / "state", own.folder.path() / "cache"});
  const auto sources = library.sources();
  ASSERT_EQ(sources->size(), 2u);
  for (const FeedSourceRef& source : *sources) {
    EXPECT_TRUE(source->staticFeed({})) << "from the mirror where its server fails";
    AlertsState state;
    EXPECT_TRUE(source->alerts(state, false, AlertsStore::kNow, {}));
    EXPECT_EQ(state.feed->name, source->name());
    EXPECT_EQ(source->isRouteOfOther({})("x1"), source->name() == "city");
  }
  std::vector<std::string> kept;
  for (const auto& file : std::filesystem::directory_iterator(own.folder.path() / "cache"))
    kept.push_back(file.path().filename());
  EXPECT_THAT(kept, testing::Contains(StartsWith("alerts")).Times(1));
  EXPECT_THAT(server.requests(), testing::Contains(HasSubstr("/alerts")).Times(1));
}

TEST(Feed, TellsWhatIsNoneFromWhatIsTheOtherHalf) {
  TestPlatform platform;
  const TemporaryFolder folder;
  const auto file = [&](const char* name, const std::string& bytes) {
    return *FeedAddress::parse(folder.write(name, bytes).native());
  };
  const FeedAddress zip = file("zip", zipOfRoutes("route_id\n1\n")), alerts = file("pb", feedBytes("")),
                    page = file("html", "\xEF\xBB\xBF \n<!DOCTYPE html>"), json = file("json", R"({"error": 1})");
  const auto codes = [&](const FeedAddress& lines, const FeedAddress& incidents) {
    const Feed feed{"a", lines, incidents};
    const FeedCache cache(folder.path() / "cache");
    const auto code = [](const auto& outcome) { return outcome ? 0 : static_cast<int>(outcome.error()->code()); };
    AlertsState state;
    return std::pair(code(StaticFeedStore(cache).readAnew(feed, {})),
                     code(AlertsStore(cache).fetch(feed, state, true, {})));
  };
  const auto pair = [](Code a, Code b) { return std::pair(static_cast<int>(a), static_cast<int>(b)); };
  EXPECT_EQ(codes(zip, alerts), std::pair(0, 0));
  for (const char size : {'<', '[', '{'}) {  // "\n<" begins a header of 60 bytes, and a page
    const std::size_t padding = static_cast<std::size_t>(size) - 7;
    const std::string header = std::string("\x0A") + size + "\x0A\x03" + "2.0" + '\x22' + static_cast<char>(padding);
    EXPECT_EQ(codes(zip, file("long", header + std::string(padding, 'v'))), std::pair(0, 0)) << size;
  }
  EXPECT_EQ(codes(alerts, zip), pair(Code::alertsForStatic, Code::staticForAlerts));
  EXPECT_EQ(codes(page, page), pair(Code::webPage, Code::webPage));
  EXPECT_EQ(codes(json, json), pair(Code::webPage, Code::webPage));
}

}  // namespace
}  // namespace nimbo
