#pragma once

#include <optional>
#include <string>

#include "host/Commands.h"
#include "protocol/Snapshot.h"

namespace nimbo {

// Lines for status bars that take one JSON object a line, as Waybar's custom modules do (waybar-custom(5)):
// {"text", "alt", "tooltip", "class"}. Text and tooltip are Pango markup. "alt" is one word: "good", "advisories",
// "none" (no favourite lines), "error", "old" (rows of an earlier session, until the first answer) or "gone" (the feeds
// do not know some lines any more, and the others run well). "class" is that word, with "gone" beside another where
// lines are gone.

/// The line for a snapshot: the compact row's title, with every row in the tooltip. Absent while
/// the widget has nothing to show: before its first fetch, without rows of the last time.
std::optional<std::string> statusBarLine(const protocol::Snapshot& snapshot);

/// The line for a widget that cannot be shown; `reason` is what went wrong and what to do.
std::string statusBarErrorLine(const std::string& reason);

/// Prints the line of `statusBarLine`. Fails, after printing the line of the error, when there is one.
int runStatusBar(const CommandContext& context, const std::optional<std::string>& now);

/// Prints a line whenever there is another one, until SIGTERM or SIGINT comes or nobody reads the output any more.
/// `notify`: incidents are told to the desktop too, as they are anyway where the settings have it so.
int runStatusWatch(const CommandContext& context, bool notify);

}  // namespace nimbo
