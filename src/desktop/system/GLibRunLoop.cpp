#include "desktop/system/GLibRunLoop.h"

#include <glib-unix.h>
#include <glib.h>

#include <utility>

#include "platform/SerialQueue.h"

namespace nimbo {

namespace {

using DescriptorCallback = std::function<void(bool)>;
using WakeCallback = std::function<void()>;

template <class Callback>
void deleteCallback(gpointer data) {
  delete static_cast<Callback*>(data);
}

gboolean descriptorIsReady(gint, GIOCondition condition, gpointer data) {
  const bool inError = condition & (G_IO_ERR | G_IO_NVAL | G_IO_HUP);
  runGuarded("descriptor callback", [&] { (*static_cast<DescriptorCallback*>(data))(inError); });
  return G_SOURCE_CONTINUE;
}

gboolean wakeUp(gpointer data) {
  runGuarded("run loop callback", *static_cast<WakeCallback*>(data));
  return G_SOURCE_CONTINUE;
}

gboolean dispatchWakeable(GSource* source, GSourceFunc callback, gpointer data) {
  // Back to sleep first: the callback may set the next time.
  g_source_set_ready_time(source, -1);
  return callback(data);
}

}  // namespace

GSourceHandle attachDescriptorSource(GMainContext* context, int fd, Readiness readiness, DescriptorCallback callback) {
  const GIOCondition ready = readiness == Readiness::readable   ? G_IO_IN
                             : readiness == Readiness::writable ? G_IO_OUT
                                                                : G_IO_PRI;
  const int condition = ready | G_IO_ERR | G_IO_HUP;
  GSourceHandle source(g_unix_fd_source_new(fd, static_cast<GIOCondition>(condition)));
  g_source_set_callback(source.get(), G_SOURCE_FUNC(descriptorIsReady), new DescriptorCallback(std::move(callback)),
                        deleteCallback<DescriptorCallback>);
  g_source_attach(source.get(), context);
  return source;
}

GSourceHandle attachWakeableSource(GMainContext* context, WakeCallback callback) {
  static GSourceFuncs functions{nullptr, nullptr, dispatchWakeable, nullptr, nullptr, nullptr};
  GSourceHandle source(g_source_new(&functions, sizeof(GSource)));
  g_source_set_callback(source.get(), wakeUp, new WakeCallback(std::move(callback)), deleteCallback<WakeCallback>);
  g_source_attach(source.get(), context);
  return source;
}

void wakeSourceIn(GSource* source, long long microseconds) {
  g_source_set_ready_time(source, microseconds > 0 ? g_get_monotonic_time() + microseconds : 0);
}

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

GSourceHandle GLibRunLoop::watchWritable(int fd, std::function<void()> callback) {
  return attachDescriptorSource(_context.get(), fd, Readiness::writable,
                                [callback = std::move(callback)](bool) { callback(); });
}

GSourceHandle GLibRunLoop::watchUrgent(int fd, std::function<void(bool inError)> callback) {
  return attachDescriptorSource(_context.get(), fd, Readiness::urgent, std::move(callback));
}

}  // namespace nimbo
