#include "desktop/gtfs/alerts/AlertPeriods.h"

#include <algorithm>

#include "desktop/gtfs/alerts/RealtimeFields.h"

namespace nimbo {

namespace {

constexpr std::uint64_t kLeastMilliseconds = 100'000'000'000;  // 10^11 seconds is the year 5138
constexpr std::uint64_t kEndOfYear9999 = 253'402'300'799;
constexpr std::chrono::hours kForgotten{24};  // after the end
constexpr std::size_t kMostOver = 16;
constexpr std::size_t kMostComing = 16;

/// How the fields with periods outrank each other; 0 for fields of another kind.
std::size_t rankOf(AlertField field) {
  switch (field) {
    case AlertField::impactPeriod:
      return 3;
    case AlertField::communicationPeriod:
      return 2;
    case AlertField::activePeriod:
      return 1;
    default:
      return 0;
  }
}

AlertPeriod readPeriod(std::string_view body) {
  AlertPeriod period;
  try {
    for (auto range = messageIn<TimeRangeField>(body); range.next();) {
      switch (range.tag()) {
        case TimeRangeField::start:
          period.start = dateOfFeedTime(takeNumber(range));
          break;
        case TimeRangeField::end:
          period.end = dateOfFeedTime(takeNumber(range));
          break;
        default:
          range.skip();
      }
    }
  } catch (const protozero::exception&) {
    return period;
  }
  return period;
}

Date startOf(const AlertPeriod& period) { return period.start.value_or(Date::min()); }
Date endOf(const AlertPeriod& period) { return period.end.value_or(Date::max()); }

}  // namespace

std::optional<Date> dateOfFeedTime(std::uint64_t time) {
  const bool isMilliseconds = time > kLeastMilliseconds;
  const std::uint64_t seconds = isMilliseconds ? time / 1000 : time;
  if (seconds == 0 || seconds > kEndOfYear9999) return std::nullopt;
  return dateFromUnixTime(static_cast<TimeInterval>(time) / (isMilliseconds ? 1000 : 1));
}

AlertPeriods alertPeriodsIn(std::string_view alert) {
  AlertPeriods result;
  std::size_t rank = 0;
  for (auto message = messageIn<AlertField>(alert); message.next();) {
    const std::size_t fieldRank = rankOf(message.tag());
    if (fieldRank == 0 || fieldRank < rank) {
      message.skip();
      continue;
    }
    if (fieldRank > rank) result = {};
    rank = fieldRank;
    ++result.published;
    const AlertPeriod period = readPeriod(takeView(message));
    if (startOf(period) < endOf(period)) result.periods.push_back(period);
  }
  if (rank == 0) result.periods.push_back({});
  return result;
}

std::vector<AlertPeriod> joinedPeriods(std::vector<AlertPeriod> periods) {
  std::sort(periods.begin(), periods.end(),
            [](const AlertPeriod& a, const AlertPeriod& b) { return startOf(a) < startOf(b); });
  std::vector<AlertPeriod> result;
  for (const AlertPeriod& period : periods) {
    if (result.empty() || startOf(period) > endOf(result.back()))
      result.push_back(period);
    else if (endOf(period) > endOf(result.back()))
      result.back().end = period.end;
  }
  return result;
}

Date nextChangeOf(const std::vector<AlertPeriod>& periods, Date now) {
  Date next = Date::max();
  const auto take = [&](std::optional<Date> date, Date::duration later) {
    if (date && *date <= Date::max() - later && *date + later > now) next = std::min(next, *date + later);
  };
  for (const AlertPeriod& period : periods) {
    take(period.start, {});
    take(period.end, Date::duration(1));  // the end itself is a part of the period
    take(period.end, kForgotten + Date::duration(1));
  }
  return next;
}

std::vector<AlertPeriod> periodsThatMatter(std::vector<AlertPeriod> periods, Date now) {
  const Date longAgo = now - kForgotten;
  std::erase_if(periods, [&](const AlertPeriod& period) { return endOf(period) < longAgo; });
  const auto notOver =
      std::find_if(periods.begin(), periods.end(), [&](const AlertPeriod& period) { return endOf(period) >= now; });
  if (static_cast<std::size_t>(notOver - periods.begin()) > kMostOver)
    periods.erase(periods.begin(), notOver - static_cast<std::ptrdiff_t>(kMostOver));
  const auto coming =
      std::find_if(periods.begin(), periods.end(), [&](const AlertPeriod& period) { return startOf(period) > now; });
  if (static_cast<std::size_t>(periods.end() - coming) > kMostComing)
    periods.erase(coming + static_cast<std::ptrdiff_t>(kMostComing), periods.end());
  return periods;
}

}  // namespace nimbo
