#include "desktop/system/LogOptions.h"

#include <unistd.h>

#include <cstdlib>
#include <string_view>

#include "desktop/system/JournalSink.h"

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

}  // namespace nimbo
