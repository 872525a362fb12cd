// The widget process from outside, through its protocol: what a host sees of the whole road from a feed to the rows.

#include <gmock/gmock.h>

#include "desktop/gtfs/feeds/FeedMuid.h"
#include "host/Programs.h"

namespace nimbo {
namespace {

using nlohmann::json;
using testing::Contains;
using testing::ElementsAre;
using testing::SizeIs;

std::vector<json> operator+(std::vector<json> a, const std::vector<json>& b) {
  a.insert(a.end(), b.begin(), b.end());
  return a;
}

const std::vector<json> kUpdateAndLook = {request("performUpdate"), request("snapshot")};
const json kExpand = request("setActiveDisplayMode", {{"mode", "expanded"}});

TEST(WidgetProcess, TellsTheStateOfLinesByItsLastFetch) {
  Programs programs;
  programs.setUpCity({"m1"}, {{"a", {"m1"}, "Works", "Slow."}});
  const json look = request("lines"), fetch = request("performUpdate");
  const auto of = [&](const std::vector<json>& events) {
    std::vector<std::string> seen;
    for (const json& line : programs.play(events))
      if (line.contains("result") && line["result"].contains("lines"))
        for (const json& report : line["result"]["lines"]) {
          seen.push_back(report["state"].get<std::string>() +
                         (report["reason"].is_null() ? "" : " " + report["reason"]["code"].dump()));
          for (const json& incident : report["incidents"]) seen.back() += " " + incident["title"].get<std::string>();
        }
    return seen;
  };
  const json start = appearing()[0];
  EXPECT_THAT(of({start, look, fetch, look, request("lines", {{"texts", false}})}),
              ElementsAre("unknown 22", "affected Works", "affected "));
  // An incident that ends is over without a fetch.
  programs.publish({{"a", {"m1"}, "Works", "Slow.", 0, Programs::unixNow() + 60}});
  EXPECT_THAT(of({start, fetch, look, request("advanceTime", {{"seconds", 61}}), look}),
              ElementsAre("affected Works", "good"));
  programs.publishBytes("no feed");
  EXPECT_THAT(of({start, fetch, look}), ElementsAre("unknown 7"));
}

TEST(WidgetProcess, KnowsWhatWasSeenUntilItChanges) {
  Programs programs;
  const json start = appearing()[0], look = request("lines"), fetch = request("performUpdate");
  const auto answersOf = [&](const std::vector<json>& events) {
    std::vector<std::string> news, ids;
    for (const json& line : programs.play(events)) {
      if (!line.contains("result") || !line["result"].contains("lines")) continue;
      for (const json& report : line["result"]["lines"])
        for (const json& incident : report["incidents"]) {
          news.push_back(incident["new"].dump());
          ids.push_back(incident["id"]);
        }
    }
    return std::pair(news, ids);
  };
  programs.setUpCity({"m1", "m2"}, {{"a", {"m1", "m2"}, "Works", "Slow."}, {"b", {"m2"}, "Storm", "Wind."}});
  const auto [news, ids] = answersOf({start, fetch, look});
  EXPECT_THAT(news, ElementsAre("true", "true", "true"));
  EXPECT_THAT(answersOf({start, request("markSeen", {{"ids", {ids.at(0), "no number"}}}), fetch, look}).first,
              ElementsAre("false", "false", "true"));
  EXPECT_THAT(answersOf({start, fetch, look}).first, ElementsAre("false", "false", "true")) << "in another process";
  programs.publish({{"c", {"m1"}, "Works", "Slow."}, {"b", {"m2"}, "Storm", "Wind."}});
  EXPECT_THAT(answersOf({start, fetch, look}).first, ElementsAre("false", "true")) << "under another number";
  programs.publish({{"a", {"m1"}, "Works", "Very slow."}, {"b", {"m2"}, "Storm", "Wind."}});
  EXPECT_THAT(answersOf({start, fetch, look}).first, ElementsAre("true", "true"));
}

TEST(WidgetProcess, ChangesItsRowsOnTheSecond) {
  Programs programs;
  const std::int64_t now = Programs::unixNow();
  programs.setUpCity({"m1"}, {{"a", {"m1"}, "Works", "Slow.", now + 60, now + 120}});
  const auto wait = [](double seconds) { return request("advanceTime", {{"seconds", seconds}}); };
  const json look = request("snapshot");
  const auto lines =
      programs.play(appearing() + kUpdateAndLook +
                    std::vector<json>{wait(59.5), look, wait(0.5), look, wait(59.5), look, wait(0.5), look});
  const auto seen = snapshots(lines);
  std::vector<std::string> firstRows;
  for (const json& snapshot : seen) firstRows.push_back(titles(snapshot).at(0));
  EXPECT_THAT(firstRows, ElementsAre("Good Service", "Good Service", "Works", "Works", "Good Service"));
  EXPECT_EQ(seen[0]["updateDates"], (json{"2026-01-05T12:01:00Z", "2026-01-05T12:02:00Z"}));
  std::vector<std::string> dates;
  for (const json& line : lines)
    if (line.contains("result") && line["result"].contains("now")) dates.push_back(line["result"]["now"]);
  EXPECT_THAT(dates, ElementsAre("2026-01-05T12:00:59.500000Z", "2026-01-05T12:01:00Z", "2026-01-05T12:01:59.500000Z",
                                 "2026-01-05T12:02:00Z"));
}

TEST(WidgetProcess, ShowsItsLastRowsBeforeAnyFetch) {
  Programs programs;
  const std::int64_t now = Programs::unixNow();
  programs.setUpCity({"m1", "m2"}, {{"a", {"m1"}, "Works", "Slow.", 0, now + 600},
                                    {"b", {"m2"}, "Storm", "Wind.", now - 9, now + 30}});
  programs.play(appearing() + kUpdateAndLook +
                std::vector<json>{kExpand, request("viewWillDisappear"), request("viewDidDisappear")});
  programs.publishBytes("no feed any more");

  // Dates that went by meanwhile are judged at once.
  for (const auto& [seconds, second] : {std::pair{0, "Storm"}, {31, "Good Service"}}) {
    const json restored = snapshots(programs.play({appearing()[0], request("advanceTime", {{"seconds", seconds}}),
                                                   request("loadView"), request("snapshot")}))
                              .at(0);
    EXPECT_EQ(restored["result"], nullptr);
    EXPECT_THAT(titles(restored), ElementsAre("Works", second));
  }
}

TEST(WidgetProcess, StartsInTheModeOfTheHostOrElseOfItsLastRows) {
  for (const char* saved : {"compact", "expanded"}) {
    Programs programs;
    programs.setUpCity({"m1", "m2"}, {{"a", {"m1"}, "Works", "Slow."}});
    programs.play(appearing() + kUpdateAndLook +
                  std::vector<json>{request("setActiveDisplayMode", {{"mode", saved}}), request("viewWillDisappear")});
    for (const char* told : {"", "compact", "expanded"}) {
      json initialize = appearing()[0];
      if (*told) initialize["params"]["activeDisplayMode"] = told;
      const auto lines = programs.play({initialize, request("loadView"), request("snapshot"), request("render")});
      const std::string mode = *told ? told : saved;
      const json size = {359.0, mode == "expanded" ? 220.0 : 110.0};
      const json seen = snapshots(lines).at(0);
      EXPECT_EQ(seen["displayMode"], mode) << saved << told;
      EXPECT_EQ(seen["expanded"], mode == "expanded") << saved << told;
      EXPECT_EQ(seen["preferredContentSize"], size) << saved << told;
      EXPECT_EQ(lines.back()["result"]["height"], size[1]) << saved << told;
      EXPECT_THAT(
          lines,
          Contains(json{{"jsonrpc", "2.0"}, {"method", "preferredContentSizeDidChange"}, {"params", {{"size", size}}}}))
          << saved << told;
    }
  }
}

TEST(WidgetProcess, HearsOfAModeOnlyWhereItIsNotInForce) {
  Programs programs;
  programs.setUpCity({"m1", "m2"}, {{"a", {"m1"}, "Works", "Slow.", Programs::unixNow() + 60}});
  const json compact = request("setActiveDisplayMode", {{"mode", "compact"}}), look = request("snapshot");
  const auto seen =
      snapshots(programs.play(appearing() + std::vector<json>{request("performUpdate"), compact, kExpand, look,
                                                              request("advanceTime", {{"seconds", 61}}), kExpand, look,
                                                              kExpand, compact, compact}));
  EXPECT_EQ(seen.at(0)["expanded"], false) << "without rows for it";
  EXPECT_EQ(seen.at(0)["displayMode"], "expanded");
  EXPECT_EQ(seen.at(0)["largestAvailableDisplayMode"], "compact");
  EXPECT_EQ(seen.at(1)["expanded"], true) << "the same mode again";
  EXPECT_EQ(seen.at(1)["largestAvailableDisplayMode"], "expanded");
  std::istringstream recorded(programs.run({"analytics", "--json"}).output);
  std::vector<int> actions;
  for (std::string line; std::getline(recorded, line);)
    if (const json entry = json::parse(line); entry.contains("action")) actions.push_back(entry["action"]);
  EXPECT_THAT(actions, ElementsAre(10, 10, 11));
}

TEST(WidgetProcess, ShowsNothingNewWhereOnlyTheFeedsDateIs) {
  Programs programs;
  const std::vector<AlertsBuilder::Alert> alerts = {{"a", {"m1"}, "Works", "Slow."}, {"b", {"m2"}, "Storm", "Wind."}};
  programs.setUpCity({"m1", "m2"}, alerts);
  const auto before = programs.play(appearing() + kUpdateAndLook + std::vector<json>{request("viewWillDisappear")});
  EXPECT_EQ(snapshots(before).at(0)["asOf"], (json{{"city", "2026-01-05T12:00:00Z"}}));

  programs.publishBytes(AlertsBuilder::feed(dateByAdding(Programs::now(), -60), alerts));
  const auto lines = programs.play(
      {appearing()[0], request("loadView"), request("snapshot"), request("performUpdate"), request("snapshot")});
  EXPECT_EQ(snapshots(lines).at(0)["asOf"], json::object());
  EXPECT_EQ(snapshots(lines).at(1)["asOf"], (json{{"city", "2026-01-05T11:59:00Z"}}));
  EXPECT_EQ(snapshots(lines).at(0)["rows"], snapshots(lines).at(1)["rows"]);
  const auto answer = std::find_if(lines.begin(), lines.end(), [](const json& line) {
    return line.contains("result") && line["result"].contains("rows");
  });
  for (auto line = answer; line != lines.end(); ++line) EXPECT_NE(line->value("method", ""), "frame");
}

TEST(WidgetProcess, WritesNoNegativeZero) {
  Programs programs;
  programs.setUpCity({"m1", "m2"}, {{"a", {"m1"}, "Works", "Slow."}});
  // Rows without a height.
  const auto seen =
      snapshots(programs.play(appearing(0) + kUpdateAndLook + std::vector<json>{kExpand, kUpdateAndLook[1]}));
  EXPECT_THAT(json(seen).dump(), testing::Not(testing::HasSubstr("-0.0")));
}

TEST(WidgetProcess, KeepsPrivatePartsFromItsHost) {
  Programs programs;
  programs.setUpCity({"m1", "b10"}, {});
  programs.folder.write("feed/routes.txt",
                        "route_id,agency_id,route_short_name,route_long_name,route_type\nm1,M,1,Harbour,1\n");
  ::setenv("NIMBO_LOG_PRIVATE", "1", 1);
  const auto lines = programs.play(appearing() + kUpdateAndLook);
  ::unsetenv("NIMBO_LOG_PRIVATE");
  EXPECT_THAT(programs.folder.read("stderr"), testing::HasSubstr("The line city:b10 is gone"));
  EXPECT_THAT(lines, Contains(json{{"jsonrpc", "2.0"},
                                   {"method", "log"},
                                   {"params",
                                    {{"level", "error"},
                                     {"category", "TransitLineService"},
                                     {"message", "The line <private> is gone from its feed"}}}}));
}

TEST(WidgetProcess, ShowsIncidentsThatAreTooManyToHandOver) {
  std::vector<AlertsBuilder::Alert> alerts;
  for (int i = 0; i < 600; ++i) {
    const std::string id = std::to_string(i);
    alerts.push_back({id, {"m1", "m2"}, "Title " + id, std::string(8000, 'x')});
  }
  Programs programs;
  programs.setUpCity({"m1", "m2"}, alerts);
  const auto lines =
      programs.play(appearing() + kUpdateAndLook +
                    std::vector<json>{request("selectRow", {{"section", 0}, {"row", 0}}), request("snapshot")});
  EXPECT_THAT(
      lines,
      Contains(json{{"jsonrpc", "2.0"},
                    {"method", "notice"},
                    {"params", {{"message", "Cannot open it: the list of incidents has more than 1048576 bytes."}}}}));
  EXPECT_THAT(snapshots(lines), SizeIs(2));
  for (const json& seen : snapshots(lines)) EXPECT_THAT(titles(seen), ElementsAre("600 Advisories"));
}

/// The results of the requests, in their order.
std::vector<json> results(const std::vector<json>& lines, const std::vector<json>& requests) {
  std::vector<json> found;
  for (const json& asked : requests)
    for (const json& line : lines)
      if (line.value("id", json()) == asked["id"]) found.push_back(line.value("result", json()));
  return found;
}

TEST(WidgetProcess, TellsOfLinesBeforeAnythingElse) {
  Programs programs;
  programs.setUpCity({}, {});
  programs.run({"feed", "add", "bad", "--static", "/none", "--alerts", "/none", "--force"});
  const std::vector<json> asked = {
      request("findLines", {{"query", "castle"}}),
      request("findLines", {{"query", ""}, {"feed", "city"}, {"offset", 1}, {"limit", 2}}),
      request("findLines", {{"query", ""}, {"feed", "nowhere"}}),
      request("describeLines", {{"lines",
                                 {{{"id", "city:old"}, {"agencyID", "M"}, {"shortName", "2"}, {"mode", 2}},
                                  {{"id", "city:gone"}},
                                  {{"id", "bad:1"}},
                                  {{"id", "nowhere:1"}},
                                  {{"muid", lineMuid("city", "m2")}},
                                  {{"muid", 7}}}}}),
  };
  const auto lines = results(programs.play(asked), asked);
  ASSERT_THAT(lines, SizeIs(4));
  EXPECT_EQ(lines[0]["total"], 1);
  const json castle = lines[0]["lines"].at(0);
  EXPECT_EQ(castle["id"], "city:m2");
  EXPECT_EQ(castle["agency"]["name"], "Metro");
  EXPECT_EQ(castle["artwork"]["accessibilityText"], "2, Castle Line");
  EXPECT_EQ(lines[0]["failures"].at(0)["feed"], "bad");
  EXPECT_EQ(lines[1]["total"], 5);
  EXPECT_THAT(lines[1]["lines"], SizeIs(2));
  EXPECT_EQ(lines[1]["lines"].at(0)["id"], "city:m2");
  EXPECT_EQ(lines[2]["failures"].at(0)["subject"], "nowhere");
  const json& described = lines[3]["lines"];
  EXPECT_EQ(described.at(0)["line"]["longName"], "Castle Line") << "renumbered";
  EXPECT_EQ(described.at(1), (json{{"line", nullptr}, {"gone", true}}));
  EXPECT_EQ(described.at(2), (json{{"line", nullptr}, {"gone", false}})) << "nobody knows";
  EXPECT_EQ(described.at(3), (json{{"line", nullptr}, {"gone", false}}));
  EXPECT_EQ(described.at(4)["line"], castle);
  EXPECT_EQ(described.at(5), (json{{"line", nullptr}, {"gone", false}}));
  EXPECT_THAT(lines[3]["failures"], SizeIs(2));
}

TEST(WidgetProcess, OutlivesEveryMessage) {
  Programs programs;
  programs.setUpCity({"m1"}, {});
  const struct {
    json line;
    int code;
  } cases[] = {
      {"{\"jsonrpc\": \"2.0\", ", -32700},
      {"[]", -32600},
      {"[{\"jsonrpc\":\"2.0\",\"id\":1,\"method\":\"snapshot\"}]", -32600},
      {"{\"jsonrpc\":\"1.0\",\"id\":1,\"method\":\"snapshot\"}", -32600},
      {"{\"jsonrpc\":\"2.0\",\"id\":1,\"method\":\"snapshot\",\"params\":[1]}", -32600},
      {std::string(5000, '[') + std::string(5000, ']'), -32600},
      {std::string("\"\xff\xfe\""), -32700},
      {R"({"jsonrpc":"2.0","method":"shutdown"})" + std::string(1, '\0'), -32700},
      {request("dance"), -32601},
      {request("initialize"), -32001},
      {request("viewDidDisappear"), -32001},
      {request("setActiveDisplayMode", {{"mode", "huge"}}), -32602},
      {request("selectRow", {{"section", 0}, {"row", 1}}), -32602},
      {request("selectRow", {{"section", 1}, {"row", 0}}), -32602},
      {request("advanceTime", {{"seconds", -1}}), -32602},
      {request("render", {{"path", "/nonexistent/folder/x.png"}}), -32602},
      {request("describeLines", {{"lines", {{{"id", "no colon"}}}}}), -32602},
      {request("checkFeed"), -32602},
      {request("checkFeed", {{"feed", "nowhere"}}), -32602},
      {request("checkFeed", {{"definition", {{"name", "a:b"}, {"static", "/none"}, {"alerts", "/none"}}}}), -32602},
      {request("cancel", {{"request", 1.5}}), -32602},
      {request("image", {{"incident", "1"}, {"width", 32}}), -32002},
      {request("render", {{"surface", "/proc/self/fd/0"}}), -32602},
      {request("render", {{"offset", -1}}), -32602},
      {request("render", {{"offset", 255'900'000}}), -32002},
      {request("render", {{"offset", 256'000'001}, {"capacity", 1'000'000}}), -32002},
      {request("render", {{"offset", 4096}, {"capacity", 157'959}}), -32002},
  };
  std::vector<json> events = appearing() + kUpdateAndLook;
  for (const auto& c : cases) events.push_back(c.line);
  const auto lines = programs.play(events + std::vector<json>{request("snapshot"), request("shutdown")});
  std::vector<int> codes;
  for (const json& line : lines)
    if (line.contains("error")) codes.push_back(line["error"]["code"]);
  ASSERT_THAT(codes, SizeIs(std::size(cases)));
  for (std::size_t i = 0; i < codes.size(); ++i) EXPECT_EQ(codes[i], cases[i].code) << cases[i].line;
  const auto seen = snapshots(lines);
  ASSERT_THAT(seen, SizeIs(2));
  EXPECT_EQ(seen[0], seen[1]) << "bad messages change nothing";
}

}  // namespace
}  // namespace nimbo
