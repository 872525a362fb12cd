#pragma once

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "platform/foundation/Date.h"

namespace nimbo {

/// When an alert is in force.
struct AlertPeriod {
  std::optional<Date> start;  ///< absent: since ever
  std::optional<Date> end;    ///< absent: no end known
  bool operator==(const AlertPeriod&) const = default;
};

/// The periods of an alert.
struct AlertPeriods {
  std::vector<AlertPeriod> periods;  ///< as published, those that can be
  std::size_t published = 0;         ///< how many the alert has in the field that counts
};

/// A time of a feed: seconds since 1970, or milliseconds from 10^11 on. Absent for 0 and for what lies beyond the year
/// 9999, both of which publishers write for "not known".
std::optional<Date> dateOfFeedTime(std::uint64_t time);

/// Reads the periods of an Alert message: those of its impact, else of its communication, else its active periods. An
/// alert that has none is always in force: one period without start and end. A period that ends at or before its start
/// is dropped; an alert of which none is left is never in force. What of a period is damaged is open. Throws
/// protozero::exception for a message that breaks off.
AlertPeriods alertPeriodsIn(std::string_view alert);

/// The same time as periods that neither overlap nor touch, the earliest first: an incident is in force once at a time.
std::vector<AlertPeriod> joinedPeriods(std::vector<AlertPeriod> periods);

/// Of joined periods those that may still matter to somebody who asks again soon: of those over for no more than a day
/// (the clock may be set back) the last 16, and of those to come the next 16.
std::vector<AlertPeriod> periodsThatMatter(std::vector<AlertPeriod> periods, Date now);

/// The next moment after `now` at which another of these periods matters, or is in force; Date::max() when none is to
/// come.
Date nextChangeOf(const std::vector<AlertPeriod>& periods, Date now);

}  // namespace nimbo
