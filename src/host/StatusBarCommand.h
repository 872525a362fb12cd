#pragma once

#include <optional>
#include <string>

#include "host/Command.h"

namespace nimbo {

/// Prints the line of `statusBarLine`. Fails, after printing the line of the error, when there is one.
int runStatusBar(const CommandContext& context, const std::optional<std::string>& now);

/// Prints a line whenever there is another one, until SIGTERM or SIGINT comes or nobody reads the output any more.
int runStatusWatch(const CommandContext& context);

}  // namespace nimbo
