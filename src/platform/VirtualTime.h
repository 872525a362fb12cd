#pragma once

#include <mutex>
#include <vector>

#include "platform/RunLoop.h"
#include "platform/SystemServices.h"

namespace nimbo {

/// A clock that stands still until told to move, and timers that fire as it passes them: the same program, run at any
/// date and any speed. `now` may be asked from any thread; the rest belongs to the main thread.
class VirtualTime final : public Clock {
 public:
  explicit VirtualTime(Date start);
  ~VirtualTime() override;

  Date now() const override;

  /// As RunLoop's operation of this name, in virtual time. A repeating timer's interval is positive.
  std::shared_ptr<Timer> scheduleTimer(TimeInterval interval, bool repeats, std::function<void(Timer&)> fire);

  /// Moves the clock by `seconds` (not negative), stopping at each timer that falls due: timers fire in the order of
  /// their dates, equal dates in the order of scheduling, each with the clock a microsecond past its own date.
  void advance(TimeInterval seconds);

  /// Sets the wall clock without time passing: nothing fires, one-shot timers keep the dates they were set for, and
  /// repeating ones the time that they still have to wait.
  void setNow(Date date);

  /// Timers that are still to fire.
  std::size_t pendingTimers() const;

 private:
  class VirtualTimer;
  void moveTo(Date date);

  mutable std::mutex _lock;
  Date _now;
  std::vector<std::shared_ptr<VirtualTimer>> _timers;  // in the order of scheduling
};

}  // namespace nimbo
