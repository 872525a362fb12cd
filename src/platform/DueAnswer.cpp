#include "platform/DueAnswer.h"

#include <utility>

#include "platform/Platform.h"

namespace nimbo {

std::shared_ptr<DueAnswer> DueAnswer::start(std::function<void()> tooLate) {
  auto due = std::make_shared<DueAnswer>();
  // Not before the next turn: virtual time that jumps passes no thread that has only just been asked.
  Platform::current().mainRunLoop().dispatchAsync([due, tooLate = std::move(tooLate)] {
    if (due->isClaimed()) return;
    due->_timer = Platform::current().mainRunLoop().scheduleTimer(kPatience, false, [due, tooLate](Timer&) {
      due->_timer = nullptr;
      if (due->claim()) tooLate();
    });
  });
  return due;
}

bool DueAnswer::claim() {
  if (_isClaimed.exchange(true)) return false;
  RunLoop& loop = Platform::current().mainRunLoop();
  const auto endTimer = [self = shared_from_this()] {
    if (self->_timer) std::exchange(self->_timer, nullptr)->invalidate();
  };
  if (loop.isCurrent())
    endTimer();
  else
    loop.dispatchAsync(endTimer);
  return true;
}

}  // namespace nimbo
