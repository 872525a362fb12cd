#pragma once

#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <thread>
#include <utility>
#include <vector>

#include "platform/RunLoop.h"
#include "platform/VirtualTime.h"

namespace nimbo {

/// The main run loop of a test: the thread that makes it is the main thread, queued work waits until the test runs
/// it, and timers follow virtual time.
class TestRunLoop final : public RunLoop {
 public:
  explicit TestRunLoop(VirtualTime& time) : _time(time) {}

  bool isCurrent() const override { return std::this_thread::get_id() == _thread; }
  void dispatchAsync(std::function<void()> work) override {
    const std::lock_guard guard(_lock);
    _queue.push_back(std::move(work));
    _arrived.notify_all();
  }
  std::shared_ptr<Timer> scheduleTimer(TimeInterval interval, bool repeats, std::function<void(Timer&)> fire) override {
    return std::make_shared<TolerantTimer>(_time.scheduleTimer(interval, repeats, std::move(fire)), tolerances);
  }

  /// Seconds that timers were given, in that order; virtual time makes no use of them.
  std::vector<TimeInterval> tolerances;

  /// Runs the queued work, and what that queues, until none is left.
  void runUntilIdle() {
    while (runOne()) {
    }
  }

  /// Runs work as it comes, from other threads too, until `done` holds; asked after each piece and after each `wake`.
  /// Throws std::runtime_error when that takes unreasonably long.
  void waitAndDrain(const std::function<bool()>& done) {
    // A guard against waiting for ever in a broken program; a working one never gets near it.
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (!done()) {
      if (runOne()) continue;
      std::unique_lock guard(_lock);
      if (!_arrived.wait_until(guard, deadline, [this] { return !_queue.empty(); }))
        throw std::runtime_error("waited in vain for work from another thread");
    }
  }

  /// Makes `waitAndDrain` look again. Any thread.
  void wake() {
    dispatchAsync([] {});
  }

  /// Drops the queued work.
  void clear() {
    std::unique_lock guard(_lock);
    const auto dropped = std::exchange(_queue, {});
    guard.unlock();  // what the work holds may queue more as it goes
  }

 private:
  struct TolerantTimer final : Timer {
    bool isValid() const override { return _timer->isValid(); }
    void invalidate() override { _timer->invalidate(); }
    void setTolerance(TimeInterval tolerance) override { _told.push_back(tolerance); }
    TolerantTimer(std::shared_ptr<Timer> timer, std::vector<TimeInterval>& told)
        : _timer(std::move(timer)), _told(told) {}
    const std::shared_ptr<Timer> _timer;
    std::vector<TimeInterval>& _told;
  };

  bool runOne() {
    std::unique_lock guard(_lock);
    if (_queue.empty()) return false;
    const auto work = std::move(_queue.front());
    _queue.pop_front();
    guard.unlock();
    work();
    return true;
  }

  VirtualTime& _time;
  const std::thread::id _thread = std::this_thread::get_id();
  std::mutex _lock;
  std::condition_variable _arrived;
  std::deque<std::function<void()>> _queue;
};

}  // namespace nimbo
