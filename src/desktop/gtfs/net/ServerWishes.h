#pragma once

#include <optional>
#include <string>

#include "desktop/gtfs/net/HTTPFetcher.h"
#include "platform/foundation/Date.h"

namespace nimbo {

/// The date of a field such as Last-Modified; absent for one that is none. Source: RFC 9110, section 5.6.7.
std::optional<Date> dateOfHTTPText(const std::string& text);

/// Seconds for which a server's answer need not be asked for again: its "max-age" less its "Age". 0 where it does not
/// say, or wants to be asked each time; never more than `kLongestFreshness`. Source: RFC 9111, sections 4.2 and 5.2.2.
TimeInterval freshnessOf(const HTTPWishes& wishes);

/// When a server that has failed wants to be asked again: absent where it does not say, or names a moment that is over;
/// never more than `kLongestRetryAfter` seconds ahead of `now`. Source: RFC 9110, section 10.2.3.
std::optional<Date> retryDateOf(const HTTPWishes& wishes, Date now);

/// Seconds. So much no server can ask for: what it tells once must not hide for long what it has to tell since.
inline constexpr TimeInterval kLongestFreshness = 5 * 60, kLongestRetryAfter = 30 * 60;

}  // namespace nimbo
