#include "platform/VirtualTime.h"

#include <algorithm>
#include <stdexcept>

namespace nimbo {

class VirtualTime::VirtualTimer final : public Timer, public std::enable_shared_from_this<VirtualTimer> {
 public:
  VirtualTimer(VirtualTime& owner, Date date, TimeInterval interval, bool repeats, std::function<void(Timer&)> fire)
      : _owner(&owner), _date(date), _interval(interval), _repeats(repeats), _fire(std::move(fire)) {}

  bool isValid() const override { return _owner != nullptr; }
  void setTolerance(TimeInterval) override {}  // virtual time has no wake-ups to share

  void invalidate() override {
    if (!_owner) return;
    const auto keep = shared_from_this();
    std::erase(_owner->_timers, keep);
    _owner = nullptr;
    _fire = nullptr;
  }

  Date date() const { return _date; }

  void wallClockWasSet(TimeInterval difference) {
    if (_repeats) _date = dateByAdding(_date, difference);
  }

  void fire() {
    const auto keep = shared_from_this();
    const auto callback = _fire;
    if (_repeats)
      _date = dateByAdding(_date, _interval);
    else
      invalidate();
    callback(*this);
  }

 private:
  VirtualTime* _owner;  // null once invalid
  Date _date;
  TimeInterval _interval;
  bool _repeats;
  std::function<void(Timer&)> _fire;
};

VirtualTime::VirtualTime(Date start) : _now(start) {}

VirtualTime::~VirtualTime() {
  for (const auto timers = _timers; const auto& timer : timers) timer->invalidate();
}

Date VirtualTime::now() const {
  const std::lock_guard guard(_lock);
  return _now;
}

void VirtualTime::setNow(Date date) {
  for (const auto& timer : _timers) timer->wallClockWasSet(intervalBetween(now(), date));
  moveTo(date);
}

void VirtualTime::moveTo(Date date) {
  const std::lock_guard guard(_lock);
  _now = date;
}

std::size_t VirtualTime::pendingTimers() const { return _timers.size(); }

std::shared_ptr<Timer> VirtualTime::scheduleTimer(TimeInterval interval, bool repeats,
                                                  std::function<void(Timer&)> fire) {
  if (repeats && !(interval > 0)) throw std::invalid_argument("a repeating timer needs a positive interval");
  auto timer = std::make_shared<VirtualTimer>(*this, dateByAdding(now(), std::max(interval, 0.0)), interval, repeats,
                                              std::move(fire));
  _timers.push_back(timer);
  return timer;
}

void VirtualTime::advance(TimeInterval seconds) {
  const Date end = dateByAdding(now(), seconds);
  const auto earlier = [](const auto& a, const auto& b) { return a->date() < b->date(); };
  for (;;) {
    const auto next = std::min_element(_timers.begin(), _timers.end(), earlier);
    if (next == _timers.end() || (*next)->date() > end) break;
    // No real timer fires at the very moment that it waits for: what lasts until then is over when it fires.
    moveTo(std::max(now(), dateByAdding((*next)->date(), 1e-6)));
    (*next)->fire();
  }
  moveTo(std::max(now(), end));
}

}  // namespace nimbo
