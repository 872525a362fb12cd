#pragma once

#include <string_view>

#include "platform/foundation/Log.h"

namespace nimbo {

/// One line as it leaves the program. The texts outlive the call that they are given to, no more.
struct LogEntry {
  LogFacility facility;
  LogLevel level;
  std::string_view redacted;  ///< private parts left out
  std::string_view text;      ///< private parts shown where the log's options say so
  std::string_view signpost;  ///< name of the point event; empty for a line of the log
};

/// Where lines go. Any thread; a line that cannot be delivered is lost, never its caller.
class LogSink {
 public:
  virtual ~LogSink() = default;
  virtual void send(const LogEntry& entry) = 0;
};

}  // namespace nimbo
