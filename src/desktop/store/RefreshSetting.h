#pragma once

#include <optional>
#include <string_view>

#include "platform/SharedSettingsStore.h"
#include "platform/foundation/Date.h"

namespace nimbo {

/// Setting: how many seconds what is on screen may be old before it is asked for again, a whole number as a text.
inline constexpr std::string_view kRefreshSecondsKey = "refreshSeconds";
inline constexpr TimeInterval kDefaultRefreshSeconds = 60, kLeastRefreshSeconds = 30, kMostRefreshSeconds = 3600;

/// The number that the text is; absent for one that is none of those allowed.
std::optional<TimeInterval> refreshSecondsIn(std::string_view text);
/// The number that is set, or the default where none is, or a wrong one.
TimeInterval refreshSecondsOf(const SharedSettingsStore& settings);

}  // namespace nimbo
