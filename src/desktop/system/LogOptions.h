#pragma once

#include <string>

#include "platform/foundation/Log.h"

namespace nimbo {

/// What the log keeps and where it goes.
struct LogOptions {
  LogLevel level = LogLevel::error;  ///< lines below this level are dropped
  bool showsPrivate = false;         ///< private arguments are written out
  bool toJournal = false;            ///< to the journal instead of standard error
  std::string unknownLevel;          ///< the level that was asked for when it is none; empty otherwise

  /// The level from NIMBO_LOG (debug, info or error), private arguments with NIMBO_LOG_PRIVATE=1, and the journal where
  /// standard error is connected to it.
  static LogOptions fromEnvironment();
};

}  // namespace nimbo
