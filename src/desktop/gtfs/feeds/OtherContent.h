#pragma once

#include <string>
#include <string_view>

#include "platform/foundation/Error.h"

namespace nimbo {

/// How many bytes of the beginning of a file tell what it is.
inline constexpr std::size_t kTellingBytes = 64;

// What somebody mistook for a feed: the other half of one, or a page of its publisher. Errors name `place`. Null for
// what may be a feed or is nothing that is known here. To be asked of alerts that could not be read: by their first
// bytes alone some feeds look like pages.

ErrorRef otherThanStatic(std::string_view beginning, const std::string& place);
ErrorRef otherThanAlerts(std::string_view beginning, const std::string& place);

}  // namespace nimbo
