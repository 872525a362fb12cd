#include "support/TestRunLoop.h"

#include <chrono>
#include <stdexcept>

namespace nimbo {

void TestRunLoop::dispatchAsync(std::function<void()> work) {
  const std::lock_guard guard(_lock);
  _queue.push_back(std::move(work));
  _arrived.notify_all();
}

bool TestRunLoop::runOne() {
  std::unique_lock guard(_lock);
  if (_queue.empty()) return false;
  const auto work = std::move(_queue.front());
  _queue.pop_front();
  guard.unlock();
  work();
  return true;
}

void TestRunLoop::runUntilIdle() {
  while (runOne()) {
  }
}

void TestRunLoop::waitAndDrain(const std::function<bool()>& done) {
  // A guard against waiting for ever in a broken program; a working one never gets near it.
  const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(30);
  while (!done()) {
    if (runOne()) continue;
    std::unique_lock guard(_lock);
    if (!_arrived.wait_until(guard, deadline, [this] { return !_queue.empty(); }))
      throw std::runtime_error("waited in vain for work from another thread");
  }
}

void TestRunLoop::clear() {
  std::unique_lock guard(_lock);
  const auto dropped = std::move(_queue);
  _queue.clear();
  guard.unlock();  // what the work holds may queue more as it goes
}

}  // namespace nimbo
