#pragma once

#include <atomic>
#include <functional>
#include <memory>

#include "platform/RunLoop.h"

namespace nimbo {

/// Sees to it that a question is answered: by whoever claims the answer first, or else, when its time is over, by the
/// one who asked. Any thread but where something else is said.
class DueAnswer final : public std::enable_shared_from_this<DueAnswer> {
 public:
  /// Seconds on the main run loop in which an answer comes.
  static constexpr TimeInterval kPatience = 60;

  /// An answer that is due from now on; `tooLate` is called on the main thread when nobody has claimed it in time. The
  /// time begins with the main thread's next turn.
  static std::shared_ptr<DueAnswer> start(std::function<void()> tooLate);

  /// True for the first caller, who is the one to answer.
  bool claim();
  bool isClaimed() const { return _isClaimed; }

 private:
  std::atomic<bool> _isClaimed = false;
  std::shared_ptr<Timer> _timer;  // main thread
};

}  // namespace nimbo
