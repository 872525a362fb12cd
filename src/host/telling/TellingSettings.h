#pragma once

#include <bitset>
#include <optional>
#include <string>

#include "platform/SharedSettingsStore.h"
#include "platform/foundation/Date.h"

namespace nimbo {

// Settings of what the user is told outside of the program's own windows.

/// "on", "off", or "severe": severe incidents alone. Not set: the user has not been asked.
inline constexpr std::string_view kNotifyKey = "notify";
/// "22:00-07:00", local time: nothing is told from the one until the other.
inline constexpr std::string_view kQuietHoursKey = "quietHours";
/// "sat,sun": days of local time on which nothing is told.
inline constexpr std::string_view kQuietDaysKey = "quietDays";

/// What is wrong with the value of one of these settings; empty for one that can be used, and for any other setting.
std::string problemOfTellingSetting(std::string_view key, const std::string& value);

/// The settings as they are kept. One that cannot be understood counts as not set.
struct TellingSettings {
  bool isOn = false;
  bool onlySevere = false;
  struct Hours {
    int from = 0, until = 0;  ///< minutes of the day
    bool operator==(const Hours&) const = default;
  };
  std::optional<Hours> quietHours;
  std::bitset<7> quietDays;  ///< from Sunday on

  static TellingSettings read(const SharedSettingsStore& settings);
  /// Whether nothing is told at a moment of local time.
  bool areQuietAt(Date date) const;
};

}  // namespace nimbo
