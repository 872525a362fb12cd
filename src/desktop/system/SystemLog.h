#pragma once

#include <memory>
#include <string>

#include "desktop/system/LogSink.h"
#include "platform/SystemServices.h"
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

/// The program's log and its point events: one stream of lines to one sink. Point events are kept at debug level, and
/// in the journal, whose readers choose for themselves.
class SystemLog final : public Log, public Signposts {
 public:
  SystemLog(const LogOptions& options, std::unique_ptr<LogSink> sink);

  bool isEnabled(LogLevel level) const override { return level >= _options.level; }
  void write(const LogFacility& facility, LogLevel level, std::string_view format,
             std::span<const LogArgument> arguments) override;
  void event(const LogFacility& facility, std::string_view name, std::string_view message) override;

 private:
  const LogOptions _options;
  const std::unique_ptr<LogSink> _sink;
};

/// The sink that `options` choose: the journal or standard error.
std::unique_ptr<LogSink> makeLogSink(const LogOptions& options);

/// A log that goes where `options` say. An unknown level is its first line.
std::unique_ptr<SystemLog> makeLog(const LogOptions& options);

}  // namespace nimbo
