#include "desktop/system/SystemLog.h"

#include <unistd.h>

#include <cstdlib>
#include <string>
#include <string_view>
#include <utility>

#include "desktop/system/LogSink.h"

namespace nimbo {

LogOptions LogOptions::fromEnvironment() {
  const auto variable = [](const char* name) -> std::string_view {
    const char* value = std::getenv(name);
    return value ? value : "";
  };
  LogOptions options;
  const std::string_view level = variable("NIMBO_LOG");
  if (level == "debug")
    options.level = LogLevel::debug;
  else if (level == "info")
    options.level = LogLevel::info;
  else if (level != "error")
    options.unknownLevel = level;
  options.showsPrivate = variable("NIMBO_LOG_PRIVATE") == "1";
  options.toJournal = isJournalStream(STDERR_FILENO, std::getenv("JOURNAL_STREAM"));
  return options;
}

SystemLog::SystemLog(const LogOptions& options, std::unique_ptr<LogSink> sink)
    : _options(options), _sink(std::move(sink)) {
  if (_options.unknownLevel.empty()) return;
  const LogArgument level(_options.unknownLevel);
  write({kDefaultLogSubsystem, "Log"}, LogLevel::error,
        "NIMBO_LOG is \"%@\", which is no level; errors only are kept. Use debug, info or error.", {&level, 1});
}

void SystemLog::write(const LogFacility& facility, LogLevel level, std::string_view format,
                      std::span<const LogArgument> arguments) {
  if (!isEnabled(level)) return;
  try {
    const std::string redacted = formatLogLine(format, arguments, true);
    const std::string shown = _options.showsPrivate ? formatLogLine(format, arguments, false) : std::string();
    _sink->send({facility, level, redacted, _options.showsPrivate ? shown : redacted, {}});
  } catch (...) {  // the line is lost; whoever wrote it has more important things to do than to handle that
  }
}

void SystemLog::event(const LogFacility& facility, std::string_view name, std::string_view message) {
  if (!_options.toJournal && !isEnabled(LogLevel::debug)) return;
  _sink->send({facility, LogLevel::debug, message, message, name});
}

std::unique_ptr<LogSink> makeLogSink(const LogOptions& options) {
  if (options.toJournal) return std::make_unique<JournalSink>();
  return std::make_unique<StandardErrorSink>();
}

std::unique_ptr<SystemLog> makeLog(const LogOptions& options) {
  return std::make_unique<SystemLog>(options, makeLogSink(options));
}

}  // namespace nimbo
