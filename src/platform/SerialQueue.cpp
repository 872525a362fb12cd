#include "platform/SerialQueue.h"

#include <exception>

#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

void logException(std::string_view what, std::string_view text) noexcept {
  try {
    writeLog({kDefaultLogSubsystem, "RunLoop"}, LogLevel::error, "A %@ threw: %@", {what, text});
  } catch (...) {  // no platform is in force, or no memory for the line: there is nobody left to tell
  }
}

}  // namespace

void runGuarded(std::string_view what, const std::function<void()>& work) noexcept {
  try {
    work();
  } catch (const std::exception& exception) {
    logException(what, exception.what());
  } catch (...) {
    logException(what, "something that is no std::exception");
  }
}

SerialQueue::~SerialQueue() {
  {
    const std::lock_guard guard(_state->lock);
    _state->stopping = true;
  }
  _state->changed.notify_all();
  if (!_thread.joinable()) return;
  if (_thread.get_id() == std::this_thread::get_id())
    _thread.detach();
  else
    _thread.join();
}

void SerialQueue::dispatchAsync(std::function<void()> work) {
  const std::lock_guard guard(_state->lock);
  _state->work.push_back(std::move(work));
  try {
    if (!_thread.joinable()) _thread = std::thread([state = _state, label = _label] { run(state, label); });
  } catch (...) {
    _state->work.pop_back();
    throw;
  }
  _state->changed.notify_one();
}

void SerialQueue::run(const std::shared_ptr<State>& state, const std::string& label) {
  for (;;) {
    std::function<void()> work;
    {
      std::unique_lock guard(state->lock);
      state->changed.wait(guard, [&] { return state->stopping || !state->work.empty(); });
      if (state->stopping) return;
      work = std::move(state->work.front());
      state->work.pop_front();
    }
    runGuarded("piece of work on the queue " + label, work);
  }
}

}  // namespace nimbo
