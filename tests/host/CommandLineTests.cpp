// The command line as its user types it.

#include <gmock/gmock.h>

#include <filesystem>

#include "host/Programs.h"

namespace nimbo {
namespace {

using nlohmann::json;
using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

const std::string kNow = "--now=2026-01-05T12:00:00Z";

TEST(CommandLine, ShowsTheSampleCityBeforeAnythingIsSetUp) {
  const Programs programs;
  const ProgramRun compact = programs.run({"status"});
  EXPECT_EQ(compact.status, 0) << compact.errors;
  EXPECT_THAT(compact.output, HasSubstr("Advisories"));
  EXPECT_THAT(compact.output, Not(HasSubstr("\x1b"))) << "no colours but on a terminal";
  EXPECT_THAT(programs.run({"status", "--expanded"}).output, HasSubstr("More Advisories"));
  const json snapshot = json::parse(programs.run({"status", "--json"}).output);
  EXPECT_EQ(snapshot["rows"][0]["class"], "NBTransitSummaryItem");
}

TEST(CommandLine, SetsUpFeedsAndFavorites) {
  const Programs programs;
  programs.setUpCity({"m2", "b10"}, {{"a", {"m2"}, "Works", "Slow."}, {"x", {"gone"}, "Old", "Line."}});
  EXPECT_THAT(programs.run({"lines", "har"}).output, AllOf(HasSubstr("city:m1"), Not(HasSubstr("city:m2"))));
  EXPECT_THAT(programs.run({"feed", "list"}).output, HasSubstr("city"));
  const ProgramRun check = programs.run({"feed", "check"});
  EXPECT_EQ(check.status, 0) << check.errors;
  EXPECT_THAT(check.output, HasSubstr("gone"))
      << "a selector that fits no line is how a false good service comes about";

  const auto order = [&] { return programs.run({"favorite", "list"}).output; };
  EXPECT_LT(order().find("city:m2"), order().find("city:b10"));
  EXPECT_EQ(programs.run({"favorite", "move", "city:b10", "1"}).status, 0);
  EXPECT_GT(order().find("city:m2"), order().find("city:b10"));
  EXPECT_EQ(programs.run({"favorite", "remove", "city:b10"}).status, 0);
  EXPECT_THAT(order(), Not(HasSubstr("city:b10")));
  EXPECT_THAT(programs.run({"status", kNow}).output, HasSubstr("Works"));
}

TEST(CommandLine, RefusesWhatItCannotDoAndSaysWhy) {
  const Programs programs;
  programs.setUpCity({"m1"}, {});
  const std::string feed = programs.folder.path() / "feed";
  const struct {
    std::vector<std::string> arguments;
    std::string says;
  } cases[] = {
      {{"feed", "add", "city", "--static", feed, "--alerts", programs.alertsFile()}, "city"},
      {{"feed", "add", "a:b", "--static", feed, "--alerts", programs.alertsFile()}, "a:b"},
      {{"feed", "add", "new", "--static", "ftp://example.org/x.zip", "--alerts", programs.alertsFile()}, "ftp:"},
      {{"feed", "remove", "nowhere"}, "nowhere"},
      {{"feed", "check", "nowhere"}, "nowhere"},
      {{"favorite", "add", "city:none"}, "none"},
      {{"favorite", "add", "nocolon"}, "nocolon"},
      {{"favorite", "add", "city:m1"}, "1"},
      {{"favorite", "remove", "city:m2"}, "m2"},
      {{"favorite", "move", "city:m1", "7"}, "7"},
      {{"settings", "get", "no.such.key"}, "no.such.key"},
      {{"decode", programs.alertsFile()}, "alerts.pb"},
      {{"script", "/nonexistent"}, "/nonexistent"},
  };
  const std::string before = programs.run({"favorite", "list"}).output + programs.run({"feed", "list"}).output;
  for (const auto& c : cases) {
    const ProgramRun result = programs.run(c.arguments);
    EXPECT_EQ(result.status, 1) << result.errors;
    EXPECT_THAT(result.errors, AllOf(HasSubstr("nimbo-transit: "), HasSubstr(c.says)));
  }
  EXPECT_EQ(programs.run({"favorite", "list"}).output + programs.run({"feed", "list"}).output, before);
  EXPECT_EQ(programs.run({"stauts"}).status, 2);
}

TEST(CommandLine, ShowsTheErrorRowForAFeedThatFails) {
  const Programs programs;
  programs.setUpCity({"m1", "b10"}, {});
  for (const std::string_view bytes :
       {std::string_view("<html><body>502 Bad Gateway</body></html>"), std::string_view(""),
        std::string_view("\x0a\x0d\x0a\x03"
                         "2.0",
                         7)}) {
    programs.publishBytes(bytes);
    const ProgramRun result = programs.run({"status", kNow});
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.output, Not(HasSubstr("Good Service"))) << bytes;
    EXPECT_THAT(result.errors, HasSubstr("alerts.pb")) << bytes;
  }
  std::filesystem::remove(programs.alertsFile());
  EXPECT_THAT(programs.run({"status", kNow}).errors, HasSubstr("alerts.pb"));

  // A favourite whose feed is not set up any more is no good service either.
  programs.publish({});
  programs.run({"feed", "remove", "city"});
  const ProgramRun orphaned = programs.run({"status", kNow});
  EXPECT_EQ(orphaned.status, 1);
  EXPECT_THAT(orphaned.output, Not(HasSubstr("Good Service")));
  EXPECT_THAT(orphaned.errors, HasSubstr("city"));
}

TEST(CommandLine, NeverTakesABrokenDatabaseForNoFavorites) {
  const Programs programs;
  programs.setUpCity({"m1"}, {});
  const auto database = programs.folder.path() / "state" / "state.sqlite";
  for (const char* suffix : {"", "-wal", "-shm"}) std::filesystem::remove(database.string() + suffix);
  std::filesystem::create_directory(database);  // something that no opening can repair
  const ProgramRun result = programs.run({"status", kNow});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.output, Not(HasSubstr("No Favorite")));
  EXPECT_THAT(result.errors, HasSubstr("state.sqlite"));
}

TEST(CommandLine, KeepsAnalyticsAndDecodesWhatIsHandedOver) {
  const Programs programs;
  programs.setUpCity({"m1"}, {{"a", {"m1"}, "Works", "Slow."}});
  programs.run({"status", kNow});
  EXPECT_THAT(programs.run({"analytics"}).output, AllOf(HasSubstr("disappearing"), HasSubstr("Works")));
  EXPECT_EQ(json::parse(programs.run({"analytics", "--json"}).output).is_object(), true);

  EXPECT_EQ(programs.run({"settings", "set", "Nimbo.TransitWidget.internal.injectFakeIncidents", "YES"}).status, 0);
  EXPECT_EQ(programs.run({"settings", "get", "Nimbo.TransitWidget.internal.injectFakeIncidents"}).output, "true\n");
}

TEST(CommandLine, TellsOfGoneLinesAndOfADatabaseSetAside) {
  const Programs programs;
  programs.setUpCity({"m1", "m2"}, {});
  programs.folder.write("feed/routes.txt", "route_id,agency_id,route_short_name,route_type\nm2,M,2,1\n");
  for (const auto& command : {std::vector<std::string>{"status", kNow}, {"favorite", "list"}}) {
    const ProgramRun run = programs.run(command);
    EXPECT_EQ(run.status, 0) << run.errors;
    EXPECT_THAT(run.errors, AllOf(HasSubstr("favorite remove city:m1"), Not(HasSubstr("city:m2"))));
  }

  const std::string database = programs.folder.path() / "state" / "state.sqlite";
  for (const auto& command : {std::vector<std::string>{"settings", "set", "a", "b"}, {"status", kNow}}) {
    for (const char* suffix : {"-wal", "-shm"}) std::filesystem::remove(database + suffix);
    programs.folder.write("state/state.sqlite", "bytes of no database");
    const ProgramRun run = programs.run(command);
    EXPECT_EQ(run.status, 1);
    EXPECT_THAT(run.errors,
                HasSubstr("nimbo-transit: " + database + " was damaged and is now kept as " + database + ".broken-"));
  }
}

TEST(CommandLine, PrintsALineForAStatusBar) {
  const Programs programs;
  const auto bar = [&] { return json::parse(programs.run({"status", "--waybar", kNow}).output); };
  programs.setUpCity({}, {});
  EXPECT_EQ(bar()["class"], "none");
  programs.run({"favorite", "add", "city:m1"});
  EXPECT_EQ(bar()["class"], "good");
  programs.publish({{"a", {"m1"}, "Lift <&> \"stairs\"", "On two lines"}});
  EXPECT_EQ(bar(), (json{{"class", "advisories"},
                         {"alt", "advisories"},
                         {"text", "[1] Lift &lt;&amp;&gt; &quot;stairs&quot;"},
                         {"tooltip", "<b>[1] Lift &lt;&amp;&gt; &quot;stairs&quot;</b>\nOn two lines"}}));
  programs.publishBytes("<no feed>");
  EXPECT_EQ(bar()["class"], "error");
  EXPECT_THAT(bar()["tooltip"].get<std::string>(), AllOf(HasSubstr("alerts.pb"), Not(HasSubstr("<no"))));
}

TEST(CommandLine, UpdatesTheRowsForTheNextStart) {
  const Programs programs;
  const auto saved = [&] { return programs.run({"settings", "get", "Nimbo.TransitWidget.savedUIData"}).output; };
  EXPECT_EQ(programs.run({"update"}).status, 0);
  const std::string rows = saved();
  EXPECT_THAT(rows, Not(testing::IsEmpty()));
  EXPECT_EQ(programs.run({"analytics"}).output, "") << "nobody has looked at the widget";
  programs.setUpCity({"m1"}, {});
  programs.publishBytes("no feed");
  EXPECT_EQ(programs.run({"update"}).status, 1);
  EXPECT_TRUE(saved() == rows) << "rows of the last time are better than none";
}

}  // namespace
}  // namespace nimbo
