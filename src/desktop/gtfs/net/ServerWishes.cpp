#include "desktop/gtfs/net/ServerWishes.h"

#include <algorithm>
#include <charconv>
#include <ctime>
#include <iomanip>
#include <limits>
#include <locale>
#include <sstream>

#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

namespace {

/// What a whole number of seconds says; one that is too large for any is the largest.
std::optional<TimeInterval> secondsIn(std::string_view text) {
  if (text.size() > 1 && text.starts_with('"') && text.ends_with('"')) text = text.substr(1, text.size() - 2);
  std::uint32_t seconds = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), seconds);
  if (text.empty() || end != text.data() + text.size()) return std::nullopt;
  if (error == std::errc::result_out_of_range) return std::numeric_limits<std::uint32_t>::max();
  return error == std::errc() ? std::optional<TimeInterval>(seconds) : std::nullopt;
}

}  // namespace

std::optional<Date> dateOfHTTPText(const std::string& text) {
  std::tm parts{};
  std::istringstream in(text);
  in.imbue(std::locale::classic());
  in >> std::get_time(&parts, "%a, %d %b %Y %H:%M:%S GMT");
  if (in.fail()) return std::nullopt;
  return dateFromUnixTime(static_cast<TimeInterval>(::timegm(&parts)));
}

TimeInterval freshnessOf(const HTTPWishes& wishes) {
  constexpr std::string_view kMaxAge = "max-age=";
  std::optional<TimeInterval> age;
  std::istringstream directives(asciiLowerCase(wishes.cacheControl));
  for (std::string part; std::getline(directives, part, ',');) {
    const std::string_view directive = trimmed(part);
    if (directive.starts_with("no-store") || directive.starts_with("no-cache")) return 0;
    if (directive.starts_with(kMaxAge) && !age) age = secondsIn(directive.substr(kMaxAge.size()));
  }
  return std::clamp(age.value_or(0) - secondsIn(wishes.age).value_or(0), 0.0, kLongestFreshness);
}

std::optional<Date> retryDateOf(const HTTPWishes& wishes, Date now) {
  const auto seconds = secondsIn(wishes.retryAfter);
  const auto date = seconds ? dateByAdding(now, *seconds) : dateOfHTTPText(wishes.retryAfter);
  if (!date || *date <= now) return std::nullopt;
  return std::min(*date, dateByAdding(now, kLongestRetryAfter));
}

}  // namespace nimbo
