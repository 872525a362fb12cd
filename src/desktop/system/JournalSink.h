#pragma once

#include <functional>
#include <span>
#include <string>

#include "desktop/system/LogSink.h"
#include "desktop/system/StandardErrorSink.h"

namespace nimbo {

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
