#pragma once

#include <functional>
#include <memory>
#include <stop_token>
#include <thread>
#include <vector>

#include "platform/RunLoop.h"

namespace nimbo {

/// Does slow work on threads of its own, so that the window lives on. Main thread only.
class Workers {
 public:
  /// What is to be done on the main thread with a piece of work's outcome.
  using Delivery = std::function<void()>;
  /// Runs on a thread of its own; ends early when asked to stop.
  using Work = std::function<Delivery(const std::stop_token& stop)>;

  /// A piece of work that somebody waits for. When it is let go the work is asked to stop and nothing is delivered.
  class Job {
   public:
    ~Job() { _stop.request_stop(); }

   private:
    friend class Workers;
    explicit Job(std::stop_source stop) : _stop(std::move(stop)) {}
    std::stop_source _stop;
  };

  /// The loop outlives this.
  explicit Workers(RunLoop& mainRunLoop) : _runLoop(mainRunLoop) {}
  /// Asks all work to stop and waits for it.
  ~Workers();

  [[nodiscard]] std::shared_ptr<Job> start(Work work);

 private:
  struct Thread;
  RunLoop& _runLoop;
  std::vector<std::shared_ptr<Thread>> _threads;
};

}  // namespace nimbo
