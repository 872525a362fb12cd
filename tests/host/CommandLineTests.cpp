// The command line as its user types it.

#include <fcntl.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include "desktop/archive/Bzip2.h"
#include "desktop/gtfs/LoopbackServer.h"
#include "desktop/gtfs/ZipOfRoutes.h"
#include "desktop/raii/FileDescriptor.h"
#include "host/Programs.h"
#include "host/TerminalRows.h"
#include "host/TerminalText.h"

namespace nimbo {
namespace {

using nlohmann::json;
using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

const std::string kNow = "--now=2026-01-05T12:00:00Z";

std::vector<std::string> words(const std::string& command) {
  std::istringstream stream(command);
  return {std::istream_iterator<std::string>(stream), {}};
}

TEST(CommandLine, SetsUpFeedsAndFavorites) {
  const Programs programs;
  programs.setUpCity({"m2", "b10"}, {{"a", {"m2"}, "Works", "Slow."}, {"x", {"gone"}, "Old", "Line."}});
  EXPECT_THAT(programs.run({"lines", "har"}).output, AllOf(HasSubstr("city:m1"), Not(HasSubstr("city:m2"))));
  programs.publishBytes(AlertsBuilder::feed(std::chrono::floor<Date::duration>(std::chrono::system_clock::now()),
                                            {{"a", {"m2"}, "Works", "Slow."}, {"x", {"gone"}, "Old", "Line."}}));
  const ProgramRun check = programs.run({"feed", "check"});
  EXPECT_EQ(check.status, 0) << check.errors;
  EXPECT_THAT(check.output, AllOf(HasSubstr("  2 alerts\n"), HasSubstr("  1 incident in force")));
  EXPECT_THAT(check.output, HasSubstr("1 × route that the static feed does not have (first: route gone)"))
      << "a selector that fits no line is how a false good service comes about";

  const auto order = [&] { return programs.run({"favorite", "list"}).output; };
  EXPECT_LT(order().find("city:m2"), order().find("city:b10"));
  EXPECT_EQ(programs.run({"favorite", "move", "city:b10", "1"}).status, 0);
  EXPECT_GT(order().find("city:m2"), order().find("city:b10"));
  EXPECT_EQ(programs.run({"favorite", "remove", "city:b10"}).status, 0);
  EXPECT_THAT(order(), Not(HasSubstr("city:b10")));
}

TEST(CommandLine, AsksWhetherAFeedOfOtherThingsHoldsAlertsToo) {
  const Programs programs;
  const std::string vehicle("\x12\x05\x0A\x01v\x22\x00", 7), feed = programs.folder.path() / "feed";
  const auto add = [&](const std::string& name, std::vector<std::string> more) {
    more.insert(more.begin(), {"feed", "add", name, "--static", feed, "--alerts", programs.alertsFile()});
    return programs.run(more);
  };
  programs.publishBytes(AlertsBuilder::feed(Programs::now(), {}) + vehicle);
  const ProgramRun refused = add("a", {});
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.errors, AllOf(HasSubstr("positions of vehicles"), HasSubstr("--combined")));
  EXPECT_EQ(programs.folder.read("config/feeds.json"), "");
  EXPECT_EQ(add("b", {"--combined", "--force"}).status, 0);
  EXPECT_THAT(programs.folder.read("config/feeds.json"), HasSubstr("combined"));
  programs.run({"feed", "remove", "b"});
  programs.publishBytes(AlertsBuilder::feed(Programs::now(), {{"a", {"m2"}, "Works", "Slow."}}) + vehicle);
  EXPECT_EQ(add("c", {"--force"}).status, 0);
  EXPECT_THAT(programs.folder.read("config/feeds.json"), HasSubstr("combined"));
}

TEST(CommandLine, LeadsFromNothingToTheStateOfALine) {
  const Programs programs;
  std::string alerts = AlertsBuilder::feed(std::chrono::floor<Date::duration>(std::chrono::system_clock::now()),
                                           {{"a", {"7"}, "Works", "Slow."}});
  std::atomic<int> fetches = 0;
  const LoopbackServer server([&](const std::string& request) -> LoopbackServer::Answer {
    if (request.find("\r\nX-Key: apikey s3cret\r\n") == std::string::npos)
      return {LoopbackServer::answer("401 Unauthorized", "")};
    const bool isStatic = request.starts_with("GET /static?part=1 ");
    if (!isStatic) ++fetches;
    return {LoopbackServer::answer("200 OK", isStatic ? zipOfRoutes("route_id,route_short_name\n7,Seven\n") : alerts)};
  });
  const json key{{"in", "header"}, {"name", "X-Key"}, {"page", "https://keys.example/get"}};
  const json files{{{"url", server.address("/static?part=1")}, {"key", key}}};
  const json feeds{{{"id", "r-7"},
                    {"provider", "Verkehrsbetriebe Zürich (VBZ)"},
                    {"country", "CH"},
                    {"municipality", "Zürich"},
                    {"alerts", {{"url", server.address("/alerts")}, {"key", key}}},
                    {"static", files}},
                   {{"id", "r-8"},
                    {"provider", "Free Rides"},
                    {"country", "AT"},
                    {"alerts", {{"url", server.address("/alerts")}}},
                    {"static", {{{"url", server.address()}}}}}};
  const std::string text = json{{"version", 1}, {"feeds", feeds}}.dump();
  const auto packed = Bzip2Compressor().Bzip2Compress(Bytes(text.begin(), text.end()));
  programs.folder.write("nimbo-transit/feed-catalog.json.bz2", std::string(packed->begin(), packed->end()));
  ::setenv("XDG_DATA_HOME", programs.folder.path().c_str(), 1);

  EXPECT_THAT(programs.run({"feed", "find", "ZURICH vbz"}).output, AllOf(HasSubstr("r-7"), Not(HasSubstr("r-8"))));
  const json found = json::parse(programs.run({"feed", "find", "switzerland", "--json"}).output);
  EXPECT_EQ(found, (json{{{"id", "r-7"},
                          {"provider", "Verkehrsbetriebe Zürich (VBZ)"},
                          {"country", "CH"},
                          {"subdivision", nullptr},
                          {"municipality", "Zürich"},
                          {"key", {{"alerts", key}, {"static", key}}}}}));
  const ProgramRun nothing = programs.run({"feed", "find", "atlantis"});
  EXPECT_EQ(nothing.status, 1);
  EXPECT_THAT(nothing.output, AllOf(HasSubstr("Austria"), HasSubstr("Switzerland")));
  EXPECT_THAT(nothing.errors, AllOf(HasSubstr("atlantis"), HasSubstr("--static")));
  EXPECT_EQ(programs.run({"feed", "find", "atlantis", "--json"}).output, "[]\n");

  const auto add = [&](const std::string& from, std::vector<std::string> more, const std::string& input = {}) {
    more.insert(more.begin(), {"feed", "add", "--from", from});
    return programs.run(more, input);
  };
  for (const auto& [more, says] : std::initializer_list<std::pair<std::vector<std::string>, const char*>>{
           {{}, "https://keys.example/get"},
           {{"--key", "wrong"}, "https://keys.example/get"},
           {{"--key-file", "-"}, "no key"},
           {{"--key", "a\nb"}, "line end"},
           {{"--key-file", "/none"}, "/none"}}) {
    const ProgramRun run = add("r-7", more);
    EXPECT_EQ(run.status, 1) << run.output;
    EXPECT_THAT(run.errors, HasSubstr(says));
  }
  EXPECT_THAT(add("r-9", {}).errors, HasSubstr("r-9"));
  EXPECT_THAT(add("r-8", {"--key", "x"}).errors, HasSubstr("wants no key"));
  EXPECT_EQ(programs.folder.read("config/feeds.json"), "");

  const ProgramRun added = add("r-7", {"--key-file", "-"}, "apikey s3cret\n");
  EXPECT_EQ(added.status, 0) << added.errors;
  EXPECT_THAT(added.output,
              AllOf(HasSubstr("vbz: 1 line"), HasSubstr("1 line affected"), HasSubstr("favorite add vbz:")));
  EXPECT_EQ(programs.run({"favorite", "add", "vbz:7"}).status, 0);
  // What other processes got is shared, unless the user asks.
  for (const auto& [arguments, count] : std::initializer_list<std::pair<std::vector<std::string>, int>>{
           {{"update"}, 0}, {{"status", "--waybar"}, 0}, {{"status"}, 1}}) {
    const int before = fetches;
    const ProgramRun run = programs.run(arguments);
    EXPECT_EQ(run.output.find("Works") != std::string::npos, arguments.front() == "status") << run.errors;
    EXPECT_EQ(fetches - before, count) << arguments.front();
  }

  // The agency gives out another key, and the old one is of no use any more.
  EXPECT_THAT(programs.run({"feed", "edit", "vbz", "--key", "old"}).errors, HasSubstr("does not take the key"));
  EXPECT_EQ(programs.run({"feed", "check"}).status, 0) << "what cannot be used changes nothing";
  EXPECT_EQ(programs.run({"feed", "edit", "vbz", "--no-keys", "--force"}).status, 0);
  EXPECT_EQ(programs.run({"feed", "check"}).status, 1);
  const std::string header = "X-Key: apikey s3cret";
  EXPECT_EQ(programs.run({"feed", "edit", "vbz", "--minor-alerts", "--maximum-age", "60"}).status, 1);
  EXPECT_EQ(programs.run({"feed", "edit", "vbz", "--minor-alerts", "--maximum-age", "60", "--header", header}).status,
            0);
  EXPECT_THAT(programs.folder.read("config/feeds.json"),
              AllOf(HasSubstr("minorAlerts"), HasSubstr("60"), Not(HasSubstr("s3cret"))));
  ::unsetenv("XDG_DATA_HOME");
}

TEST(CommandLine, RefusesWhatItCannotDoAndSaysWhy) {
  const Programs programs;
  programs.setUpCity({"m1"}, {});
  const std::string feed = programs.folder.path() / "feed";
  constexpr int kFailed = 1, kNotUnderstood = 2;
  const struct {
    int status;
    std::vector<std::string> arguments;
    std::string says;
  } cases[] = {
      {kFailed, {"feed", "add", "city", "--static", feed, "--alerts", programs.alertsFile()}, "city"},
      {kFailed, {"feed", "remove", "nowhere"}, "nowhere"},
      {kFailed, {"feed", "check", "nowhere"}, "nowhere"},
      {kFailed, {"favorite", "add", "city:none"}, "none"},
      {kFailed, {"favorite", "add", "city:m1"}, "1"},
      {kFailed, {"favorite", "remove", "city:m2"}, "m2"},
      {kFailed, {"favorite", "move", "city:m1", "7"}, "There is no position 7 among 1 favorite line."},
      {kFailed, {"settings", "get", "no.such.key"}, "no.such.key"},
      {kFailed, {"settings", "set", "refreshSeconds", "29"}, "from 30 to 3600"},
      {kFailed, {"settings", "set", "refreshSeconds", "60s"}, "from 30 to 3600"},
      {kFailed, {"decode", programs.alertsFile()}, "alerts.pb"},
      {kFailed, {"script", "/nonexistent"}, "/nonexistent"},
      {kNotUnderstood, {"stauts"}, R"(there is no command "stauts". Did you mean "status"?)"},
      {kNotUnderstood, {"favorite", "lst"}, R"(there is no command "favorite lst". Did you mean "favorite list"?)"},
      {kNotUnderstood, {"quit"}, R"(no command "quit". The commands are status, update,)"},
      {kNotUnderstood, {"feed"}, "a command is missing. The commands are find, add, edit, remove, list, check."},
      {kNotUnderstood, {"status", "--expandd"}, R"(no option "--expandd". Did you mean "--expanded"?)"},
      {kNotUnderstood, {"status", "now"}, R"("now" is more than "status" takes.)"},
      {kNotUnderstood, {"render"}, "OUT is required"},
      {kNotUnderstood, {"favorite", "move", "city:m1", "-1"}, R"(POSITION: "-1" is no position: they count from 1)"},
      {kNotUnderstood, {"status", "-1"}, R"(no option "-1")"},
      {kNotUnderstood, {"favorite", "move", "city:m1", "18446744073709551617"}, "is no position"},
      {kNotUnderstood, {"favorite", "add", "nocolon"}, R"("nocolon" is no line)"},
      {kNotUnderstood, {"feed", "add", "a:b", "--static", "/x", "--alerts", "/x"}, R"(cannot be named "a:b")"},
      {kNotUnderstood, {"feed", "add"}, "NAME or --from is required"},
      {kNotUnderstood, {"feed", "add", "new", "--alerts", "/x"}, "--static or --from is required"},
      {kNotUnderstood, {"feed", "add", "new", "--static", "ftp://example.org/x.zip", "--alerts", "/x"}, "ftp:"},
      {kNotUnderstood, {"render", "--scale", "0", "x.png"}, R"(--scale: "0" is no number from 0.25 to 8)"},
      {kNotUnderstood, {"render", "--size", "100", "x.png"}, R"(--size: "100" is no size such as 359x110)"},
      {kNotUnderstood, {"render", "--size", "infx110", "x.png"}, "infx110"},
      {kNotUnderstood, {"render", "--text-size", "tiny", "x.png"}, R"(--text-size: "tiny" is no text size)"},
      {kNotUnderstood, {"render", "out.jpg"}, R"(OUT: "out.jpg" is written as PNG alone: let its name end in .png.)"},
      {kNotUnderstood, {"status", "--now", "today"}, R"(--now: "today" is no ISO date)"},
      {kNotUnderstood, {"status", "--watch"}, "--watch requires --format waybar, i3bar or line"},
      {kNotUnderstood, {"status", "--config", ""}, "--config: the name of the folder is empty"},
  };
  const auto kept = [&] { return programs.run({"favorite", "list"}).output + programs.run({"feed", "list"}).output; };
  const std::string before = kept();
  for (const auto& c : cases) {
    const ProgramRun result = programs.run(c.arguments);
    EXPECT_EQ(result.status, c.status) << result.errors;
    EXPECT_EQ(result.output, "");
    EXPECT_THAT(result.errors, AllOf(testing::StartsWith("nimbo-transit: "), HasSubstr(c.says)));
    EXPECT_TRUE(c.status == kFailed || result.errors.ends_with("--help\".\n")) << result.errors;
  }
  EXPECT_EQ(kept(), before);
}

TEST(TerminalText, HoldsNothingThatSteersATerminal) {
  const std::string raw = "a\x1b[2J\xC2\x9B<\u202e\u2068\u05d0\u2069\u200f>\xff\nb";
  EXPECT_EQ(printableText(raw), "a [2J <\u05d0>\ufffd\nb");
  EXPECT_EQ(markupText(raw), "a [2J &lt;\u2068\u05d0\u2069\u200f&gt;\ufffd\nb");
  const std::string escaped = printableJSON(json{"é\xC2\x9B\u202e\u2068\u061c\x7f"}.dump());
  EXPECT_EQ(escaped, R"(["é\u009b\u202e\u2068\u061c\u007f"])");
  EXPECT_EQ(counted(1, "alert") + counted(0, "agency", "agencies"), "1 alert0 agencies");
}

TEST(TerminalRows, TellsLinesOfOneShortNameApart) {
  protocol::SummaryItem summary{.primaryText = "2 Advisories"};
  for (const char* name : {"1, Harbour Line", "1, Airport Bus", "2, Castle Line"})
    summary.artworks.push_back({.text = std::string(name, 1), .accessibilityText = name});
  const protocol::Snapshot snapshot{.listItem = {.summaryItem = summary}};
  EXPECT_EQ(rowsAsText(snapshot, {}), "2 Advisories\n  [1, Harbour Line] [1, Airport Bus] [2]\n");
}

TEST(CommandLine, PrintsNothingThatSteersATerminalAndTellsWhatCannotBeWritten) {
  const Programs programs;
  const std::string hostile = "\u202e\xC2\x9Bm";
  programs.folder.write("feed/routes.txt", "route_id,agency_id,route_short_name,route_type\nr" + hostile + ",M," +
                                               hostile + "1,1\nm2,M,2,1\n");
  const std::string feed = programs.folder.path() / "feed", setting = "\x1b[2J" + hostile;
  programs.run({"feed", "add", "c" + hostile, "--static", feed, "--alerts", "/none" + hostile, "--force"});
  programs.run({"favorite", "add", "c" + hostile + ":r" + hostile, "c" + hostile + ":m2"});
  programs.run({"settings", "set", "a", setting});
  programs.run({"status", kNow});
  const std::string input = R"({"jsonrpc":"2.0","id":")" + hostile + R"(","method":"dance"})";
  for (const std::string& command : std::vector<std::string>{
           "--help", "--version", "feed list", "feed check", "lines", "favorite list", "status " + kNow,
           "status --json " + kNow, "status --waybar " + kNow, "analytics", "script -", "feed check " + hostile,
           "lines none" + hostile, "favorite add " + hostile + ":m2", "settings get " + hostile,
           "decode " + feed + hostile, hostile, "--" + hostile}) {
    const ProgramRun run = programs.run(words(command), input);
    const std::string printed = run.output + run.errors;
    for (const char* steering : {"\x1b", "\u202e", "\xC2\x9B"})
      EXPECT_THAT(printed, Not(HasSubstr(steering))) << command;
    EXPECT_NE(printed, "") << command;
    if (run.output.empty()) continue;
    const ProgramRun full = programs.run(words(command), input, "/dev/full");
    EXPECT_EQ(full.status, 1) << command;
    EXPECT_THAT(full.errors, HasSubstr("nimbo-transit: cannot write to the standard output")) << command;
  }
  for (const char* command : {"settings get a", "status --waybar --watch"})
    EXPECT_THAT(programs.run(words(command), {}, "/dev/full").errors, HasSubstr("cannot write to the standard"));

  // Another program gets the setting as it was stored.
  EXPECT_EQ(programs.run({"settings", "get", "a"}).output, setting + "\n");
  const FileDescriptor terminal(posix_openpt(O_RDWR | O_NOCTTY));
  ASSERT_EQ(grantpt(terminal.get()) | unlockpt(terminal.get()), 0);
  programs.run({"settings", "get", "a"}, {}, ptsname(terminal.get()));
  char shown[64] = {};
  ASSERT_GT(::read(terminal.get(), shown, sizeof shown - 1), 0);
  EXPECT_STREQ(shown, " [2J m\r\n");
}

TEST(CommandLine, ShowsTheErrorRowForAFeedThatFails) {
  const Programs programs;
  programs.setUpCity({"m1", "b10"}, {});
  programs.publishBytes("<html><body>502 Bad Gateway</body></html>");
  const ProgramRun result = programs.run({"status", kNow});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.output, Not(HasSubstr("Good Service")));
  EXPECT_THAT(result.errors, HasSubstr("alerts.pb"));
  std::filesystem::remove(programs.alertsFile());
  EXPECT_THAT(programs.run({"status", kNow}).errors, HasSubstr("alerts.pb"));

  // A favourite whose feed is not set up any more is no good service either.
  programs.publish({});
  const auto cache = programs.folder.path() / "state/cache";
  std::vector<std::filesystem::path> kept;
  for (const auto& entry : std::filesystem::directory_iterator(cache)) kept.push_back(entry.path());
  EXPECT_FALSE(kept.empty());
  for (const auto& path : kept) std::filesystem::copy_file(path, path.string() + ".kil1ed.nimbo-part");
  programs.run({"feed", "remove", "city"});
  EXPECT_TRUE(std::filesystem::is_empty(cache));
  const ProgramRun orphaned = programs.run({"status", kNow});
  EXPECT_EQ(orphaned.status, 1);
  EXPECT_THAT(orphaned.output, Not(HasSubstr("Good Service")));
  EXPECT_THAT(orphaned.errors, HasSubstr("city"));
}

TEST(CommandLine, KeepsAnalyticsAndSettings) {
  const Programs programs;
  programs.setUpCity({"m1"}, {{"a", {"m1"}, "Works", "Slow."}, {"b", {"m1"}, "Strike", "Slower."}});
  programs.run({"status", kNow});
  EXPECT_THAT(programs.run({"analytics"}).output,
              AllOf(HasSubstr("ended by disappearing"), HasSubstr(", several incidents\n"), HasSubstr("Works")));
  EXPECT_EQ(json::parse(programs.run({"analytics", "--json"}).output).is_object(), true);
  programs.run({"status", "--expanded", kNow});
  EXPECT_THAT(programs.run({"analytics"}).output, HasSubstr("  expand the transit widget\n"));

  EXPECT_EQ(programs.run({"settings", "set", "Nimbo.TransitWidget.internal.injectFakeIncidents", "YES"}).status, 0);
  EXPECT_EQ(programs.run({"settings", "get", "Nimbo.TransitWidget.internal.injectFakeIncidents"}).output, "true\n");
}

TEST(CommandLine, TellsOfGoneLinesAndOfADatabaseSetAside) {
  const Programs programs;
  programs.setUpCity({"m1", "m2"}, {});
  programs.folder.write("feed/routes.txt", "route_id,agency_id,route_short_name,route_type\nm2,M,2,1\n");
  const ProgramRun gone = programs.run({"status", kNow});
  EXPECT_EQ(gone.status, 0) << gone.errors;
  EXPECT_THAT(gone.errors, AllOf(HasSubstr("favorite remove city:m1"), Not(HasSubstr("city:m2"))));
  EXPECT_THAT(gone.output, HasSubstr("1 line gone"));

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
  EXPECT_EQ(bar()["class"], json{"none"});
  programs.run({"favorite", "add", "city:m1"});
  programs.publish({{"a", {"m1"}, "Lift <&> \"stairs\"", "On two lines"}});
  json lift = bar();
  EXPECT_THAT(lift["tooltip"].get<std::string>(),
              testing::StartsWith("<b>[1] Lift &lt;&amp;&gt; &quot;stairs&quot;</b>\nOn two lines\n<i>Updated "));
  lift.erase("tooltip");
  EXPECT_EQ(lift, (json{{"class", {"advisories", "new"}},
                        {"alt", "advisories"},
                        {"percentage", 0},
                        {"text", "● [1] Lift &lt;&amp;&gt; &quot;stairs&quot;"}}));
  EXPECT_EQ(programs.run({"status", "--format", "line", kNow}).output, "● [1] Lift ‹&› \"stairs\"\n");
  programs.publishBytes("<no feed>");
  EXPECT_EQ(bar()["alt"], "error");
  EXPECT_THAT(bar()["tooltip"].get<std::string>(), AllOf(HasSubstr("alerts.pb"), Not(HasSubstr("<no"))));
}

TEST(CommandLine, TellsTheStateOfEachLine) {
  const Programs programs;
  const std::string feed = programs.folder.path() / "feed";
  const std::int64_t now = Programs::unixNow(), hour = 3600, day = 24 * hour;
  const auto print = [&](std::vector<std::string> options) {
    options.insert(options.begin(), {"status", kNow});
    return programs.run(options);
  };
  const auto look = [&] {
    const ProgramRun run = print({"--format", "json", "--exit-code"});
    const json status = json::parse(run.output);
    std::string text = std::to_string(run.status) + " " + status["state"].get<std::string>();
    for (const json& line : status["lines"])
      text += ", " + line["id"].get<std::string>() + " " + line["state"].get<std::string>();
    return text;
  };
  programs.setUpCity({}, {});
  EXPECT_EQ(look(), "5 none");
  programs.run({"favorite", "add", "city:m1", "city:b10"});
  EXPECT_EQ(look(), "0 good, city:m1 good, city:b10 good");

  programs.publish({{"a", {"m1"}, "Works", "Slow.", now - hour, now + hour, 4, 10, 2},
                    {"b", {"m1"}, "Strike", "", now - hour, 0, 1, 4, 4},
                    {"c", {"m1", "b10"}, "Night works", "", now + day, now + 2 * day},
                    {"d", {"b10"}, "Far off", "", now + 8 * day, 0},
                    {"e", {"b10"}, "Over", "", now - day, now - hour}});
  EXPECT_EQ(look(), "3 affected, city:m1 affected, city:b10 good");
  const json status = json::parse(print({"--format", "json"}).output);
  EXPECT_EQ(status["updated"], "2026-01-05T12:00:00Z");
  const json& line = status["lines"][0];
  EXPECT_EQ(line["incidents"][0]["title"], "Strike") << "the gravest first";
  json works = line["incidents"][1];
  EXPECT_NE(works["id"], line["incidents"][0]["id"]);
  works.erase("id");
  EXPECT_EQ(works, json::parse(R"({"title": "Works", "text": "Slow.", "from": "2026-01-05T11:00:00Z",
                                   "until": "2026-01-05T13:00:00Z", "url": null, "severity": "info",
                                   "effect": "detour", "cause": "construction", "concern": "detour",
                                   "new": true})"));
  for (const json& each : status["lines"]) {
    EXPECT_EQ(each["planned"].size(), 1U);
    EXPECT_EQ(each["planned"][0]["title"], "Night works");
    EXPECT_EQ(each["reason"], nullptr);
  }
  EXPECT_THAT(print({"--lines"}).output,
              AllOf(HasSubstr("⚠ [1] Harbour Line: 2 incidents\n  Strike (since "), HasSubstr("✓ [10]"),
                    HasSubstr("  planned: Night works (from 2026-01-06")));
  EXPECT_THAT(print({"--planned"}).output,
              AllOf(HasSubstr("Night works"), Not(HasSubstr("Far off")), Not(HasSubstr("Strike"))));
  EXPECT_THAT(print({"--expanded"}).output, AllOf(HasSubstr("Works"), HasSubstr("since "), HasSubstr("\nUpdated ")));

  // A feed that fails leaves the lines of the others what they are.
  programs.run({"feed", "add", "town", "--static", feed, "--alerts", "/none", "--force"});
  programs.run({"favorite", "add", "town:m2"});
  EXPECT_EQ(look(), "4 unknown, city:m1 affected, city:b10 good, town:m2 unknown");
  EXPECT_THAT(print({"--lines"}).output, HasSubstr("? [2] Castle Line: not known: Cannot read /none"));
  EXPECT_THAT(print({"--planned"}).output, AllOf(HasSubstr("not known"), HasSubstr("Night works")));
}

TEST(CommandLine, ListsAsJSON) {
  const Programs programs;
  programs.setUpCity({"m1"}, {});
  const json line = {{"id", "city:m1"}, {"shortName", "1"}, {"name", "1, Harbour Line"}, {"agency", "Metro"}};
  EXPECT_EQ(json::parse(programs.run({"status", "--json", kNow}).output)["rows"][0]["primaryText"], "Good Service");
  EXPECT_EQ(json::parse(programs.run({"lines", "--json", "harb"}).output), json::array({line}));
  EXPECT_EQ(json::parse(programs.run({"favorite", "list", "--json"}).output), json::array({line}));
  EXPECT_EQ(json::parse(programs.run({"feed", "list", "--json"}).output),
            json::array({{{"name", "city"},
                          {"static", programs.folder.path() / "feed"},
                          {"alerts", programs.alertsFile()},
                          {"combined", false}}}));
}

TEST(CommandLine, UpdatesTheRowsForTheNextStart) {
  const Programs programs;
  const auto saved = [&] { return programs.run({"status", "--saved"}); };
  EXPECT_EQ(saved().status, 1) << "there are none";
  programs.setUpCity({"m1"}, {{"a", {"m1"}, "Works", "Slow."}});
  EXPECT_EQ(programs.run({"update"}).status, 0);
  EXPECT_EQ(programs.run({"analytics"}).output, "") << "nobody has looked at the widget";
  programs.publishBytes("no feed");
  EXPECT_EQ(programs.run({"update"}).status, 1);
  EXPECT_THAT(saved().output, AllOf(HasSubstr("Works"), HasSubstr("\nUpdated "))) << "better than none";
}

}  // namespace
}  // namespace nimbo
