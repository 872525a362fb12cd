#pragma once

#include <optional>
#include <string>

#include "protocol/Snapshot.h"

namespace nimbo {

// Lines for status bars that take one JSON object a line, as Waybar's custom modules do (waybar-custom(5)):
// {"text", "alt", "tooltip", "class"}. Text and tooltip are Pango markup. "alt" and "class" are one word each: "good",
// "advisories", "none" (no favourite lines) or "error".

/// The line for a snapshot: the compact row's title, with every row in the tooltip. Absent while
/// the widget has nothing to show: before its first fetch, without rows of the last time.
std::optional<std::string> statusBarLine(const protocol::Snapshot& snapshot);

/// The line for a widget that cannot be shown; `reason` is what went wrong and what to do.
std::string statusBarErrorLine(const std::string& reason);

}  // namespace nimbo
