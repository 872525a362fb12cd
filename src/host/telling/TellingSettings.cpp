#include "host/telling/TellingSettings.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <ctime>

#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

namespace {

constexpr std::array<std::string_view, 7> kDays{"sun", "mon", "tue", "wed", "thu", "fri", "sat"};
constexpr int kMinutesOfHour = 60, kHoursOfDay = 24;

/// "07:30" in minutes of the day.
std::optional<int> minutesOfText(std::string_view text) {
  const auto numberOf = [](std::string_view digits, int end) -> std::optional<int> {
    int number = 0;
    const auto [last, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number);
    const bool isWhole = error == std::errc() && last == digits.data() + digits.size() && digits.size() == 2;
    return isWhole && number >= 0 && number < end ? std::optional(number) : std::nullopt;
  };
  if (text.size() != 5 || text[2] != ':') return std::nullopt;
  const auto hours = numberOf(text.substr(0, 2), kHoursOfDay), minutes = numberOf(text.substr(3), kMinutesOfHour);
  return hours && minutes ? std::optional(*hours * kMinutesOfHour + *minutes) : std::nullopt;
}

std::optional<TellingSettings::Hours> hoursOfText(std::string_view text) {
  const std::size_t dash = text.find('-');
  if (dash == std::string_view::npos) return std::nullopt;
  const auto from = minutesOfText(text.substr(0, dash)), until = minutesOfText(text.substr(dash + 1));
  if (!from || !until || *from == *until) return std::nullopt;
  return TellingSettings::Hours{*from, *until};
}

std::optional<std::bitset<7>> daysOfText(std::string_view text) {
  std::bitset<7> days;
  for (std::size_t begin = 0; begin <= text.size();) {
    const std::size_t end = std::min(text.find(',', begin), text.size());
    const std::string name = asciiLowerCase(trimmed(text.substr(begin, end - begin)));
    std::size_t day = 0;
    while (day < kDays.size() && kDays.at(day) != name) ++day;
    if (day == kDays.size()) return std::nullopt;
    days.set(day);
    begin = end + 1;
  }
  return days;
}

}  // namespace

std::string problemOfTellingSetting(std::string_view key, const std::string& value) {
  if (key == kNotifyKey && value != "on" && value != "off" && value != "severe")
    return "\"notify\" is on, off, or severe";
  if (key == kQuietHoursKey && !hoursOfText(value))
    return "\"quietHours\" is two different times of the day, such as 22:00-07:00";
  if (key == kQuietDaysKey && !daysOfText(value)) return "\"quietDays\" is days of the week, such as sat,sun";
  return {};
}

TellingSettings TellingSettings::read(const SharedSettingsStore& settings) {
  TellingSettings result;
  const auto notify = settings.stringForKey(kNotifyKey);
  result.onlySevere = notify == "severe";
  result.isOn = notify == "on" || result.onlySevere;
  if (const auto hours = settings.stringForKey(kQuietHoursKey)) result.quietHours = hoursOfText(*hours);
  if (const auto days = settings.stringForKey(kQuietDaysKey))
    result.quietDays = daysOfText(*days).value_or(std::bitset<7>());
  return result;
}

bool TellingSettings::areQuietAt(Date date) const {
  const std::time_t seconds =
      std::chrono::system_clock::to_time_t(std::chrono::time_point_cast<std::chrono::system_clock::duration>(date));
  std::tm local{};
  if (!localtime_r(&seconds, &local)) return false;
  if (quietDays.test(static_cast<std::size_t>(local.tm_wday))) return true;
  if (!quietHours) return false;
  const int minute = local.tm_hour * kMinutesOfHour + local.tm_min;
  const auto& [from, until] = *quietHours;
  return from < until ? minute >= from && minute < until : minute >= from || minute < until;
}

}  // namespace nimbo
