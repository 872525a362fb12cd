#pragma once

#include <functional>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "desktop/system/GLibRunLoop.h"
#include "desktop/system/Paths.h"
#include "host/TerminalText.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// What every command of the command line has at hand.
struct CommandContext {
  GLibRunLoop& runLoop;
  Paths paths;
  /// Arguments that give the widget process the same folders.
  std::vector<std::string> widgetArguments;
  /// Tells the user, whatever the command goes on to do, something that he must hear, such as that a damaged database
  /// was set aside. Any thread.
  std::function<void(const std::string& message)> tell = printMessage;
};

/// Ends a command: the message says what failed, where, and what to do.
struct CommandFailure : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// Throws the failure that an error tells of; nothing happens for null.
inline void require(const ErrorRef& error) {
  if (error) throw CommandFailure(error->reason());
}

/// Exit statuses of the programs.
inline constexpr int kExitSuccess = 0;
inline constexpr int kExitFailure = 1;
inline constexpr int kExitUsage = 2;

}  // namespace nimbo
