#include "desktop/system/GLibRunLoop.h"

#include <glib.h>

#include <utility>

#include "desktop/system/GLibSources.h"
#include "platform/Guarded.h"

namespace nimbo {

GLibRunLoop::GLibRunLoop(VirtualTime* virtualTime)
    : _virtualTime(virtualTime),
      _context(g_main_context_ref(g_main_context_default())),
      _loop(g_main_loop_new(_context.get(), FALSE)),
      _workSource(attachWakeableSource(_context.get(), [this] { runQueuedWork(); })) {}

GLibRunLoop::~GLibRunLoop() {
  for (const auto timers = _timers; const auto& timer : timers) timer->invalidate();
}

void GLibRunLoop::run() { g_main_loop_run(_loop.get()); }

void GLibRunLoop::quit() { g_main_loop_quit(_loop.get()); }

void GLibRunLoop::runOnce() { g_main_context_iteration(_context.get(), TRUE); }

void GLibRunLoop::dispatchAsync(std::function<void()> work) {
  {
    const std::lock_guard guard(_lock);
    _work.push_back(std::move(work));
    if (_work.size() > 1) return;  // woken already
  }
  wakeSourceIn(_workSource.get(), 0);
}

void GLibRunLoop::runQueuedWork() {
  // Only what is there now: work that queues work must not keep descriptors and timers waiting.
  std::deque<std::function<void()>> batch;
  {
    const std::lock_guard guard(_lock);
    batch.swap(_work);
  }
  for (; !batch.empty(); batch.pop_front()) runGuarded("piece of work on the main queue", batch.front());
}

std::shared_ptr<Timer> GLibRunLoop::scheduleTimer(TimeInterval interval, bool repeats,
                                                  std::function<void(Timer&)> fire) {
  auto guarded = [fire = std::move(fire)](Timer& timer) { runGuarded("timer callback", [&] { fire(timer); }); };
  if (_virtualTime) return _virtualTime->scheduleTimer(interval, repeats, std::move(guarded));
  return KernelTimer::schedule(_timers, _context.get(), interval, repeats, std::move(guarded));
}

GSourceHandle GLibRunLoop::watchReadable(int fd, std::function<void()> callback) {
  return attachDescriptorSource(_context.get(), fd, Readiness::readable,
                                [callback = std::move(callback)](bool) { callback(); });
}

GSourceHandle GLibRunLoop::watchUrgent(int fd, std::function<void(bool inError)> callback) {
  return attachDescriptorSource(_context.get(), fd, Readiness::urgent, std::move(callback));
}

}  // namespace nimbo
