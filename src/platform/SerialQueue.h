#pragma once

#include <condition_variable>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>

namespace nimbo {

/// Runs `work` as the outermost frame of a thread, or of a callback from a library: what it throws becomes a log line
/// that names `what`, where a platform is in force, and goes no further.
void runGuarded(std::string_view what, const std::function<void()>& work) noexcept;

/// Work in order on one background thread, which starts with the first piece of work.
class SerialQueue {
 public:
  explicit SerialQueue(std::string label) : _label(std::move(label)) {}
  /// Finishes the piece that is running, drops those that have not begun, and joins the thread. A queue that dies on
  /// its own thread lets that thread run out instead.
  ~SerialQueue();
  SerialQueue(const SerialQueue&) = delete;
  SerialQueue& operator=(const SerialQueue&) = delete;

  const std::string& label() const { return _label; }

  /// Runs `work` after what was given before. Any thread. What `work` throws ends up in the log. Throws
  /// std::system_error when the thread cannot start, and std::bad_alloc: then `work` never runs.
  void dispatchAsync(std::function<void()> work);

 private:
  struct State {
    std::mutex lock;
    std::condition_variable changed;
    std::deque<std::function<void()>> work;
    bool stopping = false;
  };
  static void run(const std::shared_ptr<State>& state, const std::string& label);

  std::string _label;
  std::shared_ptr<State> _state = std::make_shared<State>();
  std::thread _thread;
};

}  // namespace nimbo
