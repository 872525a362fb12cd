#include "host/window/Workers.h"

#include <atomic>

namespace nimbo {

struct Workers::Thread {
  std::atomic<bool> isDone = false;
  std::jthread thread;  // joined before the flag that it sets goes
};

Workers::~Workers() {
  for (const auto& thread : _threads) thread->thread.request_stop();
}

std::shared_ptr<Workers::Job> Workers::start(Work work) {
  std::erase_if(_threads, [](const auto& thread) { return thread->isDone.load(); });
  auto& running = *_threads.emplace_back(std::make_shared<Thread>());
  const std::shared_ptr<Job> job(new Job(std::stop_source(std::nostopstate)));
  running.thread = std::jthread(
      [this, &running, work = std::move(work), waiting = std::weak_ptr<Job>(job)](const std::stop_token& stop) {
        _runLoop.dispatchAsync([delivery = work(stop), waiting] {
          if (!waiting.expired()) delivery();
        });
        running.isDone = true;
      });
  job->_stop = running.thread.get_stop_source();
  return job;
}

}  // namespace nimbo
