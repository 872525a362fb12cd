#pragma once

#include <chrono>
#include <functional>
#include <memory>
#include <set>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/raii/GLibHandles.h"
#include "platform/RunLoop.h"

namespace nimbo {

/// The moment at or after `due`, by no more than `tolerance`, at which other timers of the machine are likely to fire
/// too: the next whole minute, else ten seconds, second or quarter second, else `due` itself. Both count from the
/// same origin. The steps are those of sd-event(3), so that wake-ups are shared with its users.
std::chrono::microseconds coalescedTime(std::chrono::microseconds due, std::chrono::microseconds tolerance);

/// A timer of the kernel, timerfd(2): a one-shot timer waits for a date of the wall clock, wherever that is set to; a
/// repeating one counts time since boot, time asleep included, and fires once for all the times that it slept through.
/// Where the kernel gives no descriptor the loop's own timeouts stand in, which look at the clock every minute.
class KernelTimer final : public Timer, public std::enable_shared_from_this<KernelTimer> {
 public:
  /// The timers that a loop keeps.
  using Set = std::set<std::shared_ptr<KernelTimer>>;

  /// Makes a timer, puts it into `owner`, which outlives its validity, and starts it.
  static std::shared_ptr<KernelTimer> schedule(Set& owner, GMainContext* context, TimeInterval interval, bool repeats,
                                               std::function<void(Timer&)> fire);

  bool isValid() const override { return _owner != nullptr; }
  void invalidate() override;
  void setTolerance(TimeInterval tolerance) override;

 private:
  KernelTimer(Set& owner, TimeInterval interval, bool repeats, std::function<void(Timer&)> fire);
  std::chrono::microseconds now() const;
  void start(GMainContext* context);
  void arm();
  bool armDescriptor();
  void descriptorIsReady();
  void fireIfDue();

  Set* _owner;  // null once invalid
  TimeInterval _interval;
  bool _repeats;
  std::function<void(Timer&)> _fire;
  TimeInterval _tolerance = 0;
  std::chrono::microseconds _due;    // on the timer's clock, without tolerance
  std::chrono::microseconds _armed;  // on the timer's clock, when it is to fire
  FileDescriptor _descriptor;        // empty: the source is a timeout of the loop
  GSourceHandle _source;
};

}  // namespace nimbo
