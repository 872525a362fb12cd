// What is told of a run of answers, and how the settings restrict it.

#include <gmock/gmock.h>

#include "host/HostPlatform.h"
#include "host/telling/Teller.h"
#include "host/telling/TellingRule.h"
#include "host/telling/TellingSettings.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using protocol::Concern;
using protocol::LineIncident;
using protocol::LineReport;
using protocol::LineState;
using protocol::Severity;
using testing::ElementsAre;
using testing::IsEmpty;

/// An incident on some of the lines 1 to 3.
struct Happening {
  std::uint64_t muid;
  std::string title = "Works";
  Severity severity = Severity::warning;
  Concern concern = Concern::delays;
  bool isNew = true;
  std::vector<std::uint64_t> lines = {1};
  bool isPlanned = false;
};

/// One rider, whose answers come a minute apart.
class Rider {
 public:
  /// "+KEY TITLE" for each notice, with a "~" for a silent one, and "-KEY" for each that is taken away.
  std::vector<std::string> hear(const std::vector<Happening>& happenings) {
    protocol::Lines answer{.asked = asked.value_or(now)};
    for (const std::uint64_t muid : favorites) {
      LineReport line{.id = feed + ":l", .muid = muid, .name = "L" + std::to_string(muid), .state = LineState::good};
      for (const Happening& one : happenings) {
        if (std::find(one.lines.begin(), one.lines.end(), muid) == one.lines.end()) continue;
        auto& list = one.isPlanned ? line.planned : line.incidents;
        list.push_back({.id = std::to_string(one.muid),
                        .title = one.title,
                        .severity = one.severity,
                        .concern = one.concern,
                        .isNew = one.isNew});
      }
      if (!line.incidents.empty()) line.state = LineState::affected;
      if (std::find(unknown.begin(), unknown.end(), muid) != unknown.end())
        line = {.muid = muid, .name = line.name, .state = LineState::unknown};
      answer.lines.push_back(std::move(line));
    }
    answer.isCut = isCut;
    if (isDamaged) answer.error = protocol::FetchError();
    last = tellChanges(state, answer, now, limits, texts);
    now += std::chrono::minutes(1);
    std::vector<std::string> heard;
    for (const Notice& notice : last.notices)
      heard.push_back((notice.silent ? "~" : "+") + notice.key + " " + notice.title);
    for (const std::string& key : last.closed) heard.push_back("-" + key);
    return heard;
  }

  TestPlatform platform;
  ToldState state;
  std::vector<std::uint64_t> favorites{1, 2, 3};
  std::vector<std::uint64_t> unknown;
  std::string feed = "city";
  bool isCut = false, isDamaged = false;
  TellingLimits limits;
  Date now = TestPlatform::startDate();
  std::optional<Date> asked;  ///< absent: now
  Telling last;
  const NoticeTexts texts{"en"};
};

constexpr std::chrono::hours kHour(1);
const std::string kSingle = " TransitWidget_Single_Line_Prepended_Incident_Text(";

TEST(Telling, TellsBeginWorseningTextsAndEndOnce) {
  Rider rider;
  EXPECT_THAT(rider.hear({}), IsEmpty());
  const Happening begins{.muid = 7, .lines = {1, 2, 3}};
  EXPECT_THAT(rider.hear({begins}), ElementsAre("+incident-7" + kSingle + "L1, L2, L3, Works)"));
  EXPECT_EQ(rider.last.notices.at(0).opens, "nimbo://incident?id=7");
  EXPECT_THAT(rider.hear({begins}), IsEmpty());
  Happening changed = begins;
  changed.title = "Longer works";
  EXPECT_THAT(rider.hear({changed}), ElementsAre("~incident-7" + kSingle + "L1, L2, L3, Longer works)"));
  for (const auto& [severity, concern] :
       {std::pair(Severity::severe, Concern::delays), {Severity::severe, Concern::noService}}) {
    changed.severity = severity;
    changed.concern = concern;
    EXPECT_THAT(rider.hear({changed}), ElementsAre("+incident-7" + kSingle + "L1, L2, L3, Longer works)"));
    EXPECT_THAT(rider.last.notices.at(0).body, testing::StartsWith("Notice_Worse"));
    EXPECT_EQ(rider.last.notices.at(0).urgency, Notice::Urgency::critical);
  }
  changed.concern = Concern::detour;
  EXPECT_THAT(rider.hear({changed}), IsEmpty());
  changed.concern = Concern::noService;
  EXPECT_THAT(rider.hear({changed}), IsEmpty());
  changed.severity = Severity::warning;
  EXPECT_THAT(rider.hear({changed}), ElementsAre("~incident-7" + kSingle + "L1, L2, L3, Longer works)"));
  changed.severity = Severity::severe;
  EXPECT_THAT(rider.hear({changed}), ElementsAre(testing::StartsWith("~"))) << "worse than ever is told, no wavering";
  EXPECT_THAT(rider.hear({}), ElementsAre("+incident-7 Notice_Ended(1)"));
  EXPECT_EQ(rider.last.notices.at(0).body,
            "TransitWidget_Single_Line_Prepended_Incident_Text(L1, L2, L3, Longer works)");
  EXPECT_THAT(rider.hear({}), IsEmpty());
  EXPECT_TRUE(rider.state.incidents.empty());
}

TEST(Telling, LeavesOutWhatDoesNotCount) {
  const auto none = [](Rider&) {};
  const auto onlySevere = [](Rider& rider) { rider.limits.onlySevere = true; };
  const auto quiet = [](Rider& rider) { rider.limits.isQuiet = true; };
  const auto newFavorite = [](Rider& rider) { rider.favorites.push_back(4); };
  const struct {
    const char* what;
    std::function<void(Rider&)> arrange;
    std::vector<Happening> before, after;
    bool isTold;
  } cases[] = {
      {"no effect", none, {}, {{.muid = 1, .concern = Concern::none}}, false},
      {"additional service", none, {}, {{.muid = 1, .concern = Concern::additionalService}}, false},
      {"information", none, {}, {{.muid = 1, .severity = Severity::info}}, false},
      {"of unknown severity", none, {}, {{.muid = 1, .severity = Severity::unknown, .concern = Concern::other}}, true},
      {"ran before", none, {{.muid = 1}}, {{.muid = 1}}, false},
      {"planned", none, {}, {{.muid = 1, .isPlanned = true}}, false},
      {"planned that begins", none, {{.muid = 1, .isPlanned = true}}, {{.muid = 1}}, true},
      {"seen", none, {}, {{.muid = 1, .isNew = false}}, false},
      {"renumbered", none, {{.muid = 1}}, {{.muid = 2}}, false},
      {"the same words on another line afterwards", none, {{.muid = 1}}, {{.muid = 2, .lines = {2}}}, true},
      {"the same words elsewhere", none, {{.muid = 1}}, {{.muid = 1}, {.muid = 2, .lines = {2}}}, true},
      {"the end of what was not told", none, {{.muid = 1}}, {}, false},
      {"in the made-up city", [](Rider& rider) { rider.feed = "sample"; }, {}, {{.muid = 1}}, false},
      {"worse in quiet hours", quiet, {{.muid = 1}}, {{.muid = 1, .severity = Severity::severe}}, false},
      {"a new favorite", newFavorite, {}, {{.muid = 1, .lines = {4}}}, false},
      {"beside a new favorite", newFavorite, {}, {{.muid = 1, .lines = {1, 4}}}, true},
      {"not severe", onlySevere, {}, {{.muid = 1}}, false},
      {"severe", onlySevere, {}, {{.muid = 1, .severity = Severity::severe}}, true},
      {"no service", onlySevere, {}, {{.muid = 1, .severity = Severity::unknown, .concern = Concern::noService}}, true},
      {"an older answer", [](Rider& rider) { rider.asked = rider.now - kHour; }, {}, {{.muid = 1}}, false},
  };
  for (const auto& test : cases) {
    Rider rider;
    rider.hear(test.before);
    test.arrange(rider);
    EXPECT_EQ(!rider.hear(test.after).empty(), test.isTold) << test.what;
  }
}

TEST(Telling, EndsOnlyWhatIsKnownToBeOver) {
  Rider rider;
  rider.hear({});
  const Happening wide{.muid = 5, .lines = {1, 2}};
  rider.hear({wide});
  rider.unknown = {2};
  EXPECT_THAT(rider.hear({}), IsEmpty()) << "it may go on on the other line";
  rider.unknown = {};
  EXPECT_THAT(rider.hear({wide}), IsEmpty());
  for (bool* lack : {&rider.isCut, &rider.isDamaged}) {
    *lack = true;
    EXPECT_THAT(rider.hear({}), IsEmpty());
    *lack = false;
  }
  // Another program's answer from before it began.
  rider.asked = rider.now - kHour;
  EXPECT_THAT(rider.hear({}), IsEmpty());
  rider.asked = std::nullopt;
  // A clock that was set back shows it as to come.
  rider.now -= std::chrono::hours(5);
  Happening planned = wide;
  planned.isPlanned = true;
  EXPECT_THAT(rider.hear({planned}), ElementsAre("-incident-5"));
  EXPECT_THAT(rider.hear({wide}), IsEmpty());
  rider.favorites = {3};
  EXPECT_THAT(rider.hear({}), IsEmpty()) << "nobody cares any more";
  EXPECT_TRUE(rider.state.incidents.empty());
}

TEST(Telling, TellsAPeriodThatComesAfterDaysAgain) {
  Rider rider;
  rider.hear({});
  Happening works{.muid = 1};
  EXPECT_EQ(rider.hear({works}).size(), 1u);
  for (const int hours : {20, 100}) {
    works.isPlanned = true;
    rider.hear({works});
    rider.now += std::chrono::hours(hours);
    works.isPlanned = false;
    EXPECT_EQ(rider.hear({works}).size(), hours > 24 ? 1u : 0u) << hours;
  }
}

TEST(Telling, GathersWhatBeginsTogetherAndWhatQuietHoursHeldBack) {
  Rider rider;
  rider.hear({});
  const Happening one{.muid = 1}, two{.muid = 2, .title = "Storm", .severity = Severity::severe};
  Happening three{.muid = 3, .title = "Fog"};
  EXPECT_THAT(rider.hear({one, two}), ElementsAre("+incidents-1 TransitWidget_Summary_advisory_count(2)"));
  EXPECT_THAT(rider.last.notices.at(0).body, testing::MatchesRegex(".*Storm.*\n.*Works.*")) << "the gravest first";
  rider.limits.isQuiet = true;
  EXPECT_THAT(rider.hear({one, two, three}), IsEmpty());
  const Happening four{.muid = 4, .title = "Ice", .lines = {2}};
  EXPECT_THAT(rider.hear({one, three, four}), ElementsAre(testing::StartsWith("~incidents-1" + kSingle)))
      << "what is over goes without a word";
  rider.limits.isQuiet = false;
  EXPECT_THAT(rider.hear({one, three, four}), ElementsAre("+incidents-3 TransitWidget_Summary_advisory_count(2)"));
  three.isNew = false;
  EXPECT_THAT(rider.hear({one, three, four}), ElementsAre(testing::StartsWith("~incidents-3" + kSingle + "L2, Ice")))
      << "what was seen leaves its notice";
  EXPECT_THAT(rider.hear({one}), ElementsAre("+ended-3 Notice_Ended(2)", "-incidents-3"));
  EXPECT_THAT(rider.hear({}), ElementsAre("+incident-1 Notice_Ended(1)", "-incidents-1"));
}

TEST(Telling, BoundsWhatThousandsSay) {
  Rider rider;
  rider.hear({});
  std::vector<Happening> all;
  for (std::uint64_t i = 1; i <= 5000; ++i) all.push_back({.muid = i, .title = std::string(5000, 'x')});
  ASSERT_EQ(rider.hear(all).size(), 1u);
  EXPECT_LT(rider.last.notices.at(0).body.size(), 2000u);
  for (Happening& one : all) one.title = "y";
  EXPECT_EQ(rider.hear(all).size(), 1u);
  EXPECT_EQ(rider.hear({}).size(), 2u);
}

TEST(Teller, OfABarRemembersWhatCannotBeKept) {
  setenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent", 1);
  GLibRunLoop loop;
  HostPlatform platform({loop, Paths::resolve("/dev/null/config", "/dev/null/state"), {}});
  protocol::Lines lines{.lines = {{.id = "city:m1", .muid = 1, .name = "1"}}};
  const auto errorDomainOf = [&](Teller& teller, LineState state, std::vector<LineIncident> incidents) {
    lines.asked = currentDate();
    lines.lines[0].state = state;
    lines.lines[0].incidents = std::move(incidents);
    std::optional<std::string> domain;
    teller.take(lines, [&](const ErrorRef& error) { domain = error ? error->domain() : "none"; });
    while (!domain) loop.runOnce();
    return *domain;
  };
  Teller bar(loop, *platform.operator->(), {.isAsked = true});
  EXPECT_EQ(errorDomainOf(bar, LineState::good, {}), "none");
  const LineIncident works{.id = "7", .title = "Works", .concern = Concern::delays};
  EXPECT_EQ(errorDomainOf(bar, LineState::affected, {works}), kNoticeErrorDomain) << "it has tried to tell";
}

TEST(TellingSettings, AreQuietByHoursAndDays) {
  setenv("TZ", "UTC", 1);
  tzset();
  const struct {
    const char *hours, *days, *date;
    bool isQuiet;
  } cases[] = {
      {"22:00-07:00", "", "2026-01-05T22:00:00Z", true},  {"22:00-07:00", "", "2026-01-05T06:59:59Z", true},
      {"22:00-07:00", "", "2026-01-05T07:00:00Z", false}, {"12:00-13:30", "", "2026-01-05T13:29:00Z", true},
      {"12:00-13:30", "", "2026-01-05T11:59:00Z", false}, {"", "mon, SUN", "2026-01-05T12:00:00Z", true},
      {"", "sat,sun", "2026-01-05T12:00:00Z", false},     {"", "", "2026-01-05T12:00:00Z", false},
  };
  for (const auto& test : cases) {
    MemorySettings settings;
    const auto store = settings.groupStore();
    store->setValue_forKey(std::string(test.hours), kQuietHoursKey);
    store->setValue_forKey(std::string(test.days), kQuietDaysKey);
    EXPECT_EQ(TellingSettings::read(*store).areQuietAt(*dateFromISOText(test.date)), test.isQuiet) << test.date;
  }
  for (const auto& [key, value] : {std::pair(kNotifyKey, "yes"),
                                   {kQuietHoursKey, "22-7"},
                                   {kQuietHoursKey, "24:00-07:00"},
                                   {kQuietHoursKey, "07:00-07:00"},
                                   {kQuietDaysKey, "sat,,sun"}})
    EXPECT_NE(problemOfTellingSetting(key, value), "") << value;
}

}  // namespace
}  // namespace nimbo
