#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "host/notices/Notice.h"
#include "platform/RunLoop.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// Domain of errors in telling the user something.
inline constexpr std::string_view kNoticeErrorDomain = "org.nimbo.Notices";

enum class NoticeError {
  noBus = 1,  ///< there is no session bus, or it went away
  noService,  ///< the desktop has no notification service
  noAnswer,   ///< somebody on the bus did not answer in time
  refused,    ///< somebody on the bus answered with an error, or with nonsense
  tooMuch     ///< more notices, longer texts or other addresses than are taken; nothing was shown
};

/// Hands notices over to nimbo-transit-notices, which stays while they stand, replaces them and opens what is clicked.
/// Where that is not installed, the notices are shown by this process: they open nothing, and desktops may take them
/// away when it ends. Opens the session bus with the first use. Main thread only.
///
/// A notice does nothing that tells the same as what stands under its key, or stood there until the user dismissed it
/// or it expired: that is known for as long as one of the programs lives that handed over to nimbo-transit-notices, or
/// a notice stands.
class NoticeSender {
 public:
  /// Null when all went well, which includes that there was nothing to do; else what went wrong first. On the main
  /// thread, once, never before the call returns; never after the sender went.
  using Completion = std::function<void(const ErrorRef& error)>;

  /// The run loop outlives the sender; it runs GLib's default main context.
  explicit NoticeSender(RunLoop& runLoop);
  ~NoticeSender();
  NoticeSender(const NoticeSender&) = delete;
  NoticeSender& operator=(const NoticeSender&) = delete;

  /// Shows notices, or changes those that stand under their keys. At most 50 at once, with keys of 200 bytes, titles of
  /// 1000, bodies of 10,000 and addresses of 2000; a key once. Answers within half a minute.
  void post(std::vector<Notice> notices, Completion completion);
  /// Takes away what stands under the keys, and forgets what stood there. Starts no program for that. Answers within
  /// half a minute.
  void close(std::vector<std::string> keys, Completion completion);

 private:
  class Impl;
  std::unique_ptr<Impl> _impl;
};

}  // namespace nimbo
