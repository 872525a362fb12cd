#include "desktop/store/RefreshSetting.h"

#include <charconv>

namespace nimbo {

std::optional<TimeInterval> refreshSecondsIn(std::string_view text) {
  int seconds = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), seconds);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return seconds >= kLeastRefreshSeconds && seconds <= kMostRefreshSeconds ? std::optional<TimeInterval>(seconds)
                                                                           : std::nullopt;
}

TimeInterval refreshSecondsOf(const SharedSettingsStore& settings) {
  return refreshSecondsIn(settings.stringForKey(kRefreshSecondsKey).value_or("")).value_or(kDefaultRefreshSeconds);
}

}  // namespace nimbo
