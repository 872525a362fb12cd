#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <string_view>

namespace nimbo {

/// A moment on the wall clock, in UTC, to the microsecond; spans far more than the years 1 to 9999.
using Date = std::chrono::sys_time<std::chrono::microseconds>;

/// Seconds.
using TimeInterval = double;

/// Seconds from `from` to `to`; positive when `to` is the later one.
TimeInterval intervalBetween(Date from, Date to);

/// `date` moved by `seconds`, kept within what a Date can hold.
Date dateByAdding(Date date, TimeInterval seconds);

/// A Date from seconds since 1970, kept within what a Date can hold.
Date dateFromUnixTime(TimeInterval seconds);

/// Reads an ISO 8601 date: "2026-01-05", or with a time "2026-01-05T00:17", seconds, fractions, and "Z" or an offset
/// ("+02:00"); without an offset it is UTC. Absent when the text is no such date.
std::optional<Date> dateFromISOText(std::string_view text);

/// "2026-01-05T00:17:43Z", with a fraction only where there is one.
std::string isoTextOfDate(Date date);

}  // namespace nimbo
