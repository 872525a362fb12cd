#pragma once

#include <unistd.h>

#include <functional>
#include <mutex>
#include <span>
#include <string>
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

/// Whether `descriptor` is the stream that the journal handed to this process: `journalStream`, the value of the
/// variable JOURNAL_STREAM, names the descriptor's device and inode. Null or malformed text: it is not.
/// Source: systemd.exec(5).
bool isJournalStream(int descriptor, const char* journalStream);

/// The system's journal: MESSAGE and PRIORITY as in systemd.journal-fields(7), SUBSYSTEM, CATEGORY, and SIGNPOST with
/// the name of a point event.
class JournalSink final : public LogSink {
 public:
  /// Delivers the fields ("NAME=value") of one entry; false when that is not possible.
  using Send = std::function<bool(std::span<const std::string> fields)>;

  /// The default asks libsystemd, which is opened for the first entry.
  explicit JournalSink(Send send = sendThroughLibrary);
  /// What the journal does not take goes to standard error.
  void send(const LogEntry& entry) override;

 private:
  static bool sendThroughLibrary(std::span<const std::string> fields);

  Send _send;
  StandardErrorSink _fallback;
};

}  // namespace nimbo
