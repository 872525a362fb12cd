#include "desktop/system/KernelTimer.h"

#include <sys/timerfd.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <ctime>
#include <stdexcept>
#include <utility>

#include "desktop/system/GLibRunLoop.h"

namespace nimbo {

using std::chrono::microseconds;

microseconds coalescedTime(microseconds due, microseconds tolerance) {
  constexpr microseconds kSteps[] = {std::chrono::minutes(1), std::chrono::seconds(10), std::chrono::seconds(1),
                                     std::chrono::milliseconds(250)};
  for (const microseconds step : kSteps) {
    if (due > microseconds::max() - step) continue;
    const microseconds wait = (step - due % step) % step;
    if (wait <= tolerance) return due + wait;
  }
  return due;
}

namespace {

microseconds after(microseconds moment, TimeInterval seconds) {
  return dateByAdding(Date(moment), seconds).time_since_epoch();
}

}  // namespace

KernelTimer::KernelTimer(Set& owner, TimeInterval interval, bool repeats, std::function<void(Timer&)> fire)
    : _owner(&owner),
      _interval(interval),
      _repeats(repeats),
      _fire(std::move(fire)),
      _due(after(now(), std::max(interval, 0.0))),
      _armed(_due) {}

std::shared_ptr<KernelTimer> KernelTimer::schedule(Set& owner, GMainContext* context, TimeInterval interval,
                                                   bool repeats, std::function<void(Timer&)> fire) {
  if (std::isnan(interval)) throw std::invalid_argument("a timer's interval is a number");
  if (repeats && !(interval > 0)) throw std::invalid_argument("a repeating timer needs a positive interval");
  const std::shared_ptr<KernelTimer> timer(new KernelTimer(owner, interval, repeats, std::move(fire)));
  owner.insert(timer);
  timer->start(context);
  return timer;
}

void KernelTimer::invalidate() {
  if (!_owner) return;
  const auto keep = shared_from_this();
  std::exchange(_owner, nullptr)->erase(keep);
  _source.reset();
  _descriptor = FileDescriptor();
  _fire = nullptr;
}

void KernelTimer::setTolerance(TimeInterval tolerance) {
  _tolerance = tolerance > 0 ? tolerance : 0;
  if (isValid()) arm();
}

microseconds KernelTimer::now() const {
  timespec time{};
  ::clock_gettime(_repeats ? CLOCK_BOOTTIME : CLOCK_REALTIME, &time);
  // Rounded up, so that nothing fires early.
  return std::chrono::seconds(time.tv_sec) + std::chrono::ceil<microseconds>(std::chrono::nanoseconds(time.tv_nsec));
}

void KernelTimer::start(GMainContext* context) {
  _descriptor =
      FileDescriptor(::timerfd_create(_repeats ? CLOCK_BOOTTIME : CLOCK_REALTIME, TFD_NONBLOCK | TFD_CLOEXEC));
  if (_descriptor && armDescriptor()) {
    _source =
        attachDescriptorSource(context, _descriptor.get(), Readiness::readable, [this](bool) { descriptorIsReady(); });
    return;
  }
  _descriptor = FileDescriptor();
  _source = attachWakeableSource(context, [this] { fireIfDue(); });
  arm();
}

void KernelTimer::arm() {
  _armed = coalescedTime(_due, after({}, _tolerance));
  if (_descriptor) {
    armDescriptor();
  } else {
    constexpr microseconds kLongestWait = std::chrono::minutes(1);
    wakeSourceIn(_source.get(), std::min(_armed - now(), kLongestWait).count());
  }
}

bool KernelTimer::armDescriptor() {
  // Long past or before 1970 is due at once; all zero would disarm the timer.
  const microseconds moment = std::max(_armed, microseconds(1));
  const auto seconds = std::chrono::floor<std::chrono::seconds>(moment);
  itimerspec time{};
  time.it_value.tv_sec = seconds.count();
  time.it_value.tv_nsec = std::chrono::nanoseconds(moment - seconds).count();
  const int flags = TFD_TIMER_ABSTIME | (_repeats ? 0 : TFD_TIMER_CANCEL_ON_SET);
  // Refused with ECANCELED where the clock was set since it was last armed; the next try counts from there.
  int result = 0;
  do result = ::timerfd_settime(_descriptor.get(), flags, &time, nullptr);
  while (result != 0 && errno == ECANCELED);
  return result == 0;
}

void KernelTimer::descriptorIsReady() {
  std::uint64_t expirations = 0;
  if (::read(_descriptor.get(), &expirations, sizeof expirations) < 0 && errno != ECANCELED) return;
  fireIfDue();
}

void KernelTimer::fireIfDue() {
  const microseconds present = now();
  if (present < _armed) {  // the wall clock was set
    arm();
    return;
  }
  const auto keep = shared_from_this();
  const auto fire = _fire;
  if (_repeats) {
    const double passed = std::floor(std::chrono::duration<double>(present - _due).count() / _interval);
    _due = std::max(after(_due, (passed + 1) * _interval), present + microseconds(1));
    arm();
  } else {
    invalidate();
  }
  fire(*this);
}

}  // namespace nimbo
