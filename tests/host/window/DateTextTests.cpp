#include <unicode/timezone.h>

#include "host/window/Texts.h"
#include "platform/transit/TransitIncident.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

// In a year that is over: dates about today are told as such.
TEST(DateText, TellsTheHoursAroundAChangeOfDaylightSavingTime) {
  icu::TimeZone::adoptDefault(icu::TimeZone::createTimeZone("Europe/Berlin"));
  const struct {
    const char *start, *end, *text;
  } cases[] = {
      {"2020-03-29T00:59:00Z", "2020-03-29T01:00:00Z", "29. März 2020, 01:59, 29. März 2020, 03:00"},
      {"2020-10-25T00:30:00Z", "2020-10-25T01:30:00Z", "25. Oktober 2020, 02:30, 25. Oktober 2020, 02:30"},
      {"2020-10-25T01:00:00Z", "2020-10-25T23:00:00Z", "25. Oktober 2020, 02:00, 26. Oktober 2020, 00:00"},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.start);
    const TestPlatform platform;
    const auto start = dateFromISOText(c.start), end = dateFromISOText(c.end);
    EXPECT_EQ(DateText("de").textOfPeriod(start, end, dateByAdding(*start, -1)),
              std::string("Window_Period_FromUntil(") + c.text + ")");
  }
}

TEST(DateText, WritesTodayInCapitalsWhereItBeginsThePeriod) {
  TestPlatform platform;
  const Date now = std::chrono::floor<Date::duration>(std::chrono::system_clock::now());
  platform.strings.texts = {{"Window_Period_FromUntil", "{0} bis {1}"}, {"Window_Period_Until", "Bis {0}"}};
  const DateText dates("de");
  // "heute", or "gestern" since a moment ago.
  EXPECT_THAT(dates.textOfPeriod(now, now, now), testing::MatchesRegex(".*\\([HG]e.*, [hg]e.*\\)"));
  EXPECT_THAT(dates.textOfPeriod({}, now, now), testing::MatchesRegex(".*\\([hg]e.*\\)"));
  EXPECT_THAT(dates.textOf(now), testing::MatchesRegex("[hg]e.*"));
  // The phrases are English ones for lack of Polish texts.
  EXPECT_THAT(DateText("pl_PL").textOf(now), testing::MatchesRegex("(today|yesterday).*"));
}

TEST(IncidentTexts, SayNothingTwice) {
  const TestPlatform platform;
  using Texts = std::vector<std::string>;
  const struct {
    std::optional<std::string> summary, description;
    Texts shown;
  } cases[] = {
      {"Buses turn.", "Buses turn.\nStop B is closed.", {"Buses turn.\nStop B is closed."}},
      {"Reason: Strike.", "Works\nReason\n\nStrike. More.", {"Works\nReason\n\nStrike. More."}},
      {"One train in three", "A strike.", {"One train in three", "A strike."}},
      {"Works", "Works", {}},
      {"Buses turn.", {}, {"Buses turn."}},
      {{}, "A strike.", {"A strike."}},
  };
  for (const auto& c : cases) {
    TransitIncidentFields fields;
    fields.title = "Works";
    fields.summary = c.summary;
    fields.fullDescription = c.description;
    EXPECT_EQ(textsBelowTitle(BasicTransitIncident(std::move(fields))), c.shown);
  }
}

}  // namespace
}  // namespace nimbo
