#pragma once

#include <optional>
#include <string>

#include "host/BarFormats.h"
#include "host/Commands.h"

namespace nimbo {

/// Prints what a bar shows after an update, or with `options.saved` the rows of the last time without one. Fails, after
/// printing the line of the error, when there is one.
int runStatusBar(const CommandContext& context, const BarFormat& format, const StatusOptions& options);

/// Prints a line whenever there is another one, until SIGTERM or SIGINT comes or nobody reads the output any more.
/// Where the bar sends click events, left opens the window, middle marks what is shown as seen, right opens the window
/// at what is planned.
/// `notify`: incidents are told to the desktop too, as they are anyway where the settings have it so.
int runStatusWatch(const CommandContext& context, const BarFormat& format, bool notify);

}  // namespace nimbo
