#pragma once

#include <unistd.h>

#include <mutex>

#include "desktop/system/LogSink.h"

namespace nimbo {

/// One line of text each: "ERROR subsystem category: text", for a point event "SIGNPOST subsystem category: name:
/// text". Control characters come out escaped, so that a text can neither make up lines nor steer a terminal.
class StandardErrorSink final : public LogSink {
 public:
  /// The descriptor stays the caller's and outlives the sink.
  explicit StandardErrorSink(int descriptor = STDERR_FILENO) : _descriptor(descriptor) {}
  void send(const LogEntry& entry) override;

 private:
  int _descriptor;
  std::mutex _lock;
};

}  // namespace nimbo
