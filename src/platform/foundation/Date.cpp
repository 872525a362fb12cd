#include "platform/foundation/Date.h"

#include <charconv>
#include <cstdint>
#include <cstdio>
#include <cstdlib>

namespace nimbo {

using std::chrono::microseconds;

TimeInterval intervalBetween(Date from, Date to) {
  // Each side in seconds first: the difference of two far dates may exceed 64 bits of microseconds.
  const auto seconds = [](Date date) { return static_cast<long double>(date.time_since_epoch().count()) / 1e6L; };
  return static_cast<TimeInterval>(seconds(to) - seconds(from));
}

Date dateByAdding(Date date, TimeInterval seconds) {
  const long double micros = static_cast<long double>(date.time_since_epoch().count()) + seconds * 1e6L;
  if (micros >= static_cast<long double>(INT64_MAX)) return Date::max();
  if (micros <= static_cast<long double>(INT64_MIN)) return Date::min();
  return Date(microseconds(static_cast<std::int64_t>(micros + (micros < 0 ? -0.5L : 0.5L))));
}

Date dateFromUnixTime(TimeInterval seconds) { return dateByAdding(Date{}, seconds); }

namespace {

/// Takes `digits` decimal digits off the front of `text`.
std::optional<int> takeNumber(std::string_view& text, std::size_t digits) {
  int value = 0;
  if (text.size() < digits) return std::nullopt;
  const auto [end, error] = std::from_chars(text.data(), text.data() + digits, value);
  if (error != std::errc() || end != text.data() + digits || text.front() == '-') return std::nullopt;
  text.remove_prefix(digits);
  return value;
}

bool takeCharacter(std::string_view& text, char c) {
  if (text.empty() || text.front() != c) return false;
  text.remove_prefix(1);
  return true;
}

/// "Z", "+hh:mm", "+hhmm" or nothing; the offset in minutes east of UTC.
std::optional<int> takeOffset(std::string_view& text) {
  if (text.empty() || takeCharacter(text, 'Z')) return 0;
  const bool west = text.front() == '-';
  if (!takeCharacter(text, '+') && !takeCharacter(text, '-')) return std::nullopt;
  const auto hours = takeNumber(text, 2);
  takeCharacter(text, ':');
  const auto minutes = takeNumber(text, 2);
  if (!hours || !minutes || *hours > 23 || *minutes > 59) return std::nullopt;
  const int offset = *hours * 60 + *minutes;
  return west ? -offset : offset;
}

/// The digits after a decimal point, as microseconds; further digits are dropped.
std::optional<std::int64_t> takeFraction(std::string_view& text) {
  std::int64_t micros = 0, unit = 100000;
  std::size_t count = 0;
  for (; count < text.size() && text[count] >= '0' && text[count] <= '9'; ++count, unit /= 10)
    micros += (text[count] - '0') * unit;
  text.remove_prefix(count);
  if (count == 0) return std::nullopt;
  return micros;
}

}  // namespace

std::optional<Date> dateFromISOText(std::string_view text) {
  using namespace std::chrono;
  const auto y = takeNumber(text, 4);
  if (!y || !takeCharacter(text, '-')) return std::nullopt;
  const auto m = takeNumber(text, 2);
  if (!m || !takeCharacter(text, '-')) return std::nullopt;
  const auto d = takeNumber(text, 2);
  if (!d) return std::nullopt;
  const year_month_day day{year(*y), month(static_cast<unsigned>(*m)), std::chrono::day(static_cast<unsigned>(*d))};
  if (!day.ok()) return std::nullopt;
  microseconds time{0};
  int offset = 0;
  if (takeCharacter(text, 'T') || takeCharacter(text, ' ')) {
    const auto hour = takeNumber(text, 2);
    if (!hour || *hour > 23 || !takeCharacter(text, ':')) return std::nullopt;
    const auto minute = takeNumber(text, 2);
    if (!minute || *minute > 59) return std::nullopt;
    time = hours(*hour) + minutes(*minute);
    if (takeCharacter(text, ':')) {
      const auto second = takeNumber(text, 2);
      if (!second || *second > 60) return std::nullopt;
      time += seconds(*second);
      if (takeCharacter(text, '.')) {
        const auto fraction = takeFraction(text);
        if (!fraction) return std::nullopt;
        time += microseconds(*fraction);
      }
    }
    const auto east = takeOffset(text);
    if (!east) return std::nullopt;
    offset = *east;
  }
  if (!text.empty()) return std::nullopt;
  return Date(sys_days(day)) + time - minutes(offset);
}

std::string isoTextOfDate(Date date) {
  using namespace std::chrono;
  const auto midnight = floor<days>(date);
  const year_month_day day(midnight);
  const hh_mm_ss<microseconds> time(date - midnight);
  char text[80];
  int length = std::snprintf(text, sizeof text, "%04d-%02u-%02uT%02d:%02d:%02d", static_cast<int>(day.year()),
                             static_cast<unsigned>(day.month()), static_cast<unsigned>(day.day()),
                             static_cast<int>(time.hours().count()), static_cast<int>(time.minutes().count()),
                             static_cast<int>(time.seconds().count()));
  std::string result(text, static_cast<std::size_t>(length));
  if (time.subseconds().count() != 0) {
    length = std::snprintf(text, sizeof text, ".%06lld", static_cast<long long>(time.subseconds().count()));
    result.append(text, static_cast<std::size_t>(length));
  }
  return result + "Z";
}

}  // namespace nimbo
