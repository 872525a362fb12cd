#pragma once

#include <functional>
#include <memory>

#include "platform/foundation/Date.h"

namespace nimbo {

/// A timer on the main run loop. The loop keeps a scheduled timer, and what its callback holds, until the timer is
/// invalidated or, one-shot, has fired. Main thread only.
class Timer {
 public:
  virtual ~Timer() = default;
  /// False once invalidated, and for a one-shot timer once it has fired.
  virtual bool isValid() const = 0;
  /// Ends the timer and lets go of its callback; harmless when repeated.
  virtual void invalidate() = 0;
  /// How many seconds late it may fire, so that wake-ups can be shared. 0 until set.
  virtual void setTolerance(TimeInterval tolerance) = 0;
};

/// The main thread's queue of work and its timers.
class RunLoop {
 public:
  virtual ~RunLoop() = default;

  /// Whether the calling thread is the main thread.
  virtual bool isCurrent() const = 0;

  /// Runs `work` on the main thread after what is queued already; never before the call returns. Any thread.
  virtual void dispatchAsync(std::function<void()> work) = 0;

  /// Schedules a timer that fires after `interval` seconds of wall time, time asleep included; then, when it repeats,
  /// every `interval` seconds. A one-shot timer also follows the wall clock when that is set. Main thread only.
  virtual std::shared_ptr<Timer> scheduleTimer(TimeInterval interval, bool repeats,
                                               std::function<void(Timer&)> fire) = 0;
};

/// Stops the process with a message when the caller is not on the main thread.
void assertMainQueue();

}  // namespace nimbo
