#pragma once

#include <functional>
#include <memory>
#include <string>

#include "desktop/system/LogSink.h"
#include "platform/RunLoop.h"

namespace nimbo {

/// Sends each line on to another sink, and lines of errors, private parts redacted, to the host as well: there on the
/// main thread, after what is queued.
class HostLogSink final : public LogSink {
 public:
  using Tell = std::function<void(const std::string& category, const std::string& text)>;

  /// `runLoop`, and what `tell` holds, outlive the lines that are still to be told.
  HostLogSink(std::unique_ptr<LogSink> next, RunLoop& runLoop, Tell tell)
      : _next(std::move(next)), _runLoop(runLoop), _tell(std::move(tell)) {}

  void send(const LogEntry& entry) override {
    _next->send(entry);
    if (entry.level != LogLevel::error || !entry.signpost.empty()) return;
    _runLoop.dispatchAsync([tell = _tell, category = std::string(entry.facility.category),
                            text = std::string(entry.redacted)] { tell(category, text); });
  }

 private:
  std::unique_ptr<LogSink> _next;
  RunLoop& _runLoop;
  Tell _tell;
};

}  // namespace nimbo
