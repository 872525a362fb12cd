#pragma once

#include <string>

#include "host/Command.h"

namespace nimbo {

/// Prints a setting: "true", "false", the text (as it is but to a terminal), or the bytes as base64. Fails when it is
/// not set.
int runSettingsGet(const CommandContext& context, const std::string& key);
/// Stores "true", "YES", "false" or "NO" as a boolean, anything else as a text.
int runSettingsSet(const CommandContext& context, const std::string& key, const std::string& value);
int runSettingsUnset(const CommandContext& context, const std::string& key);

/// Prints the analytics that are kept, the oldest first.
int runAnalytics(const CommandContext& context, bool json);

/// Has the widget process read a hand-off payload or a saved state, and prints it as JSON; "-" is the standard input.
/// Fails with what is wrong and where.
int runDecode(const CommandContext& context, const std::string& file);

}  // namespace nimbo
