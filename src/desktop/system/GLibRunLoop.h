#pragma once

#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>

#include "desktop/raii/GLibHandles.h"
#include "desktop/system/KernelTimer.h"
#include "platform/RunLoop.h"
#include "platform/VirtualTime.h"

namespace nimbo {

/// What a watched descriptor has to be ready with.
enum class Readiness {
  readable,  ///< data, or the end of it
  writable,  ///< room for some data
  urgent     ///< exceptional data (POLLPRI), as kernel files announce events
};

/// Attaches a source to `context` that calls `callback` for as long as `fd` is ready or in error, and says whether it
/// is in error or its other end is gone. Kernel files tell each event to the first who polls: the callback must not
/// poll again. The descriptor stays the caller's and outlives the source.
GSourceHandle attachDescriptorSource(GMainContext* context, int fd, Readiness readiness,
                                     std::function<void(bool inError)> callback);

/// Attaches a source to `context` that calls `callback` once for each time it was woken; it sleeps at first.
GSourceHandle attachWakeableSource(GMainContext* context, std::function<void()> callback);

/// Wakes a source of `attachWakeableSource` in `microseconds` from now, instead of when it was to wake before. Any
/// thread.
void wakeSourceIn(GSource* source, long long microseconds);

/// The main run loop over GLib's default main context; the thread that makes it is the main thread. One at a time in a
/// process. What callbacks throw is logged, and the loop goes on. Ends its timers and drops queued work when it goes.
class GLibRunLoop final : public RunLoop {
 public:
  /// With `virtualTime`, which outlives the loop, timers wait for that instead of the machine's clocks.
  explicit GLibRunLoop(VirtualTime* virtualTime = nullptr);
  ~GLibRunLoop() override;
  GLibRunLoop(const GLibRunLoop&) = delete;
  GLibRunLoop& operator=(const GLibRunLoop&) = delete;

  /// Runs until `quit`. Main thread only. A toolkit that runs the default main context itself needs no call of this.
  void run();
  /// Ends the run that is going on. Any thread.
  void quit();
  /// Waits for the next thing to do and does what is ready. For a program that waits for one answer. Main thread only.
  void runOnce();

  bool isCurrent() const override { return std::this_thread::get_id() == _thread; }
  void dispatchAsync(std::function<void()> work) override;
  std::shared_ptr<Timer> scheduleTimer(TimeInterval interval, bool repeats, std::function<void(Timer&)> fire) override;

  /// Calls `callback` on the main thread for as long as `fd` has something to read, is at its end or in error, until
  /// the handle goes. The descriptor stays the caller's and outlives the handle. Main thread only.
  GSourceHandle watchReadable(int fd, std::function<void()> callback);
  /// The same for as long as it takes something to write.
  GSourceHandle watchWritable(int fd, std::function<void()> callback);
  /// The same for exceptional conditions (POLLPRI), by which kernel files announce events. Each event is told once, by
  /// the call itself: polling again finds nothing. Told `inError`, the file is gone and nothing else will come of it.
  GSourceHandle watchUrgent(int fd, std::function<void(bool inError)> callback);

 private:
  void runQueuedWork();

  const std::thread::id _thread = std::this_thread::get_id();
  VirtualTime* _virtualTime;
  GMainContextHandle _context;
  GMainLoopHandle _loop;
  std::mutex _lock;
  std::deque<std::function<void()>> _work;
  GSourceHandle _workSource;
  KernelTimer::Set _timers;
};

}  // namespace nimbo
