// What both ends say to each other, as it stands in a line.

#include <gtest/gtest.h>

#include "protocol/Coding.h"
#include "protocol/Methods.h"

namespace nimbo::protocol {
namespace {

using nlohmann::json;

/// What reading says is wrong; empty when nothing is.
template <class Message>
std::string fault(const std::string& text) {
  try {
    read<Message>(json::parse(text));
    return {};
  } catch (const Malformed& malformed) {
    return malformed.what();
  }
}

TEST(Protocol, TellsWhereAMessageIsMalformedAndWhatBelongsThere) {
  const struct {
    std::string (*fault)(const std::string&);
    const char* text;
    const char* says;
  } cases[] = {
      {fault<Nothing>, "[]", "it must be an object"},
      {fault<Nothing>, R"({"more": 1})", ""},
      {fault<InitializeParams>, "{}", ""},
      {fault<InitializeParams>, R"({"locale": null})", "\"locale\" must be a text"},
      {fault<InitializeParams>, R"({"scale": 8.5})", "\"scale\" must be a number from 0.25 to 8.0"},
      {fault<InitializeParams>, R"({"scale": "1"})", "\"scale\" must be a number from 0.25 to 8.0"},
      {fault<InitializeParams>, R"({"appearance": "Dark"})", R"("appearance" must be one of "light", "dark")"},
      {fault<InitializeParams>, R"({"displayModes": {"compact": [1, 2]}})", "\"displayModes.expanded\" must be given"},
      {fault<InitializeParams>, R"({"displayModes": {"compact": [1, -2], "expanded": [1, 2]}})",
       "\"displayModes.compact\" must be [width, height], each a number from 0.0 to 100000.0"},
      {fault<InitializeParams>, R"({"bundle": {"kind": "a", "identifier": "b", "containing": {"kind": "c"}}})",
       "\"bundle.containing.identifier\" must be given"},
      {fault<RowParams>, R"({"section": 0, "row": 4294967296})", "\"row\" must be a whole number, 0 or more"},
      {fault<RowParams>, R"({"section": 0, "row": 1.5})", "\"row\" must be a whole number, 0 or more"},
      {fault<Rendered>, R"({"width": -2147483649})", "\"width\" must be a whole number"},
      {fault<HighlightParams>, R"({"section": 0, "row": 1, "highlighted": 1})",
       "\"highlighted\" must be true or false"},
      {fault<Advanced>, R"({"now": "soon"})", "\"now\" must be an ISO date"},
      {fault<OpenUserActivityParams>, R"({"activityType": "a", "userInfo": {"bs": 1}})",
       "\"userInfo.bs\" must be a text"},
      {fault<Handoff>, R"({"text": "", "line": null, "incidents": [{"muid": -1}]})",
       "\"incidents.0.muid\" must be a whole number, 0 or more"},
  };
  for (const auto& test : cases) EXPECT_EQ(test.fault(test.text), test.says) << test.text;
}

TEST(Protocol, ReadsWhatItWrites) {
  Snapshot snapshot{.maxNumberOfRows = UINT64_MAX - 1,
                    .result = FetchResult::error,
                    .error = FetchError{"d", -7, "r", "s", std::nullopt}};
  const TransitItem incident{.primaryText = "1",
                             .artwork = Artwork{.shield = Shield{.color = "#112233"}, .size = 3, .alpha = 0.5},
                             .openable = Openable{.activityType = "a"}};
  const SummaryItem summary{.primaryText = "all", .artworks = {{.text = "7", .icon = Icon{.iconType = 1}}}};
  snapshot.listItem = {summary, {incident}};
  snapshot.rows = {{.item = incident, .views = {{.className = "View", .views = {{.className = "Inner"}}}}},
                   {.cell = "C"}};
  snapshot.knownIncidents = {{"1", "Signals fail"}};
  const std::string line = write(snapshot).dump();
  EXPECT_EQ(write(read<Snapshot>(json::parse(line))).dump(), line);
  const json row = json::parse(line)["rows"][0];
  EXPECT_EQ(row["class"], "NBTransitItem") << "the item's keys stand among the row's own";
  EXPECT_EQ(row["secondaryText"], nullptr);
  EXPECT_FALSE(row["artwork"].contains("image"));
  EXPECT_EQ(row["artwork"]["shield"]["color"], "#112233");
  EXPECT_EQ(write(InitializeParams{.displayModes = DisplayModes{{1, 2}, {3, 4}}})["displayModes"],
            json({{"compact", {1.0, 2.0}}, {"expanded", {3.0, 4.0}}}));
}

}  // namespace
}  // namespace nimbo::protocol
