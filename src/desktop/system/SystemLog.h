#pragma once

#include <memory>

#include "desktop/system/LogOptions.h"
#include "desktop/system/LogSink.h"
#include "platform/Signposts.h"
#include "platform/foundation/Log.h"

namespace nimbo {

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
