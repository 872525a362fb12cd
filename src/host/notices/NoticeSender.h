#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "host/notices/Notice.h"
#include "host/notices/NoticeError.h"
#include "platform/RunLoop.h"

namespace nimbo {

/// Hands notices over to nimbo-transit-notices, which stays while they stand, replaces them and opens what is clicked.
/// Where that is not installed, the notices are shown by this process: they open nothing, and desktops may take them
/// away when it ends. Opens the session bus with the first use. Main thread only.
///
/// A notice does nothing that tells the same as what stands under its key, or stood there until the user dismissed it
/// or it expired: that is known for as long as one of the programs lives that handed over to nimbo-transit-notices, or
/// a notice stands.
class NoticeSender {
 public:
  /// Called on the main thread, once, never before the call returns; never after the sender went.
  using Completion = NoticeCompletion;

  /// The run loop outlives the sender; it runs GLib's default main context.
  explicit NoticeSender(RunLoop& runLoop);
  ~NoticeSender();
  NoticeSender(const NoticeSender&) = delete;
  NoticeSender& operator=(const NoticeSender&) = delete;

  /// Shows notices, or changes those that stand under their keys. At most 50 at once, with keys of 200 bytes, titles of
  /// 4000, bodies of 50,000 and addresses of 2000; a key once. Answers within half a minute.
  void post(std::vector<Notice> notices, Completion completion);
  /// Takes away what stands under the keys, at most 10,000, and forgets what stood there. Starts no program for that.
  /// Answers within half a minute.
  void close(std::vector<std::string> keys, Completion completion);

 private:
  class Impl;
  std::unique_ptr<Impl> _impl;
};

}  // namespace nimbo
