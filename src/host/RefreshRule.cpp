#include "host/RefreshRule.h"

#include <limits>
#include <utility>

namespace nimbo {

RefreshRule::RefreshRule(RunLoop& runLoop, RandomSource& random, std::function<bool()> spares, Ask ask)
    : _runLoop(runLoop), _random(random), _spares(std::move(spares)), _ask(std::move(ask)) {}

RefreshRule::~RefreshRule() { cancel(); }

void RefreshRule::cancel() {
  if (_next) std::exchange(_next, nullptr)->invalidate();
}

void RefreshRule::setOnScreen(bool isOnScreen) {
  if (isOnScreen == std::exchange(_isOnScreen, isOnScreen)) return;
  cancel();
  _hasFailed = _asksAgain = false;
  _retries.reset();
  if (isOnScreen) ask();
}

void RefreshRule::ask() {
  cancel();
  _ask(_period / 2);
}

void RefreshRule::askNow() {
  if (!_isOnScreen) return;
  if (_next)
    ask();
  else
    _asksAgain = true;
}

void RefreshRule::networkReturned() {
  if (!_next || !_hasFailed) return;
  _retries.reset();
  ask();
}

void RefreshRule::answered(const protocol::UpdateResult& result) {
  if (!_isOnScreen) return;
  _period = result.refreshSeconds * (_spares() ? kSparingFactor : 1);
  if (std::exchange(_asksAgain, false)) return ask();
  _hasFailed = result.updateResult == WidgetUpdateResult::Failed;
  if (_hasFailed) return askIn(_retries.next());
  _retries.reset();
  // An older one serves since its server wants that: there is nothing to catch up with.
  const TimeInterval age = result.age.value_or(0);
  askIn(_period - (age <= _period / 2 ? age : 0));
}

void RefreshRule::askIn(TimeInterval seconds) {
  cancel();
  const double chance = _random.next() / static_cast<double>(std::numeric_limits<std::uint32_t>::max());
  // One that repeats waits for time to pass, whatever clock is set meanwhile.
  _next = _runLoop.scheduleTimer(seconds * (1 + kSpread * (2 * chance - 1)), true, [this](Timer&) { ask(); });
}

}  // namespace nimbo
