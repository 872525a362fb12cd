#pragma once

#include <vector>

#include "platform/MemoryPressure.h"

namespace nimbo {

/// Memory pressure that a test makes. Main thread.
class MemoryPressureDouble final : public MemoryPressure {
 public:
  struct Source {
    MemoryPressureKind kind;
    std::shared_ptr<SerialQueue> queue;
    std::function<void()> handler;
    bool isActive = false;
  };

  std::unique_ptr<MemoryPressureSource> makeSource(MemoryPressureKind kind, std::shared_ptr<SerialQueue> queue,
                                                   std::function<void()> handler) override {
    _sources.push_back(std::make_shared<Source>(Source{kind, std::move(queue), std::move(handler)}));
    return std::make_unique<Handle>(_sources.back());
  }

  /// Every source that was made, in order.
  const std::vector<std::shared_ptr<Source>>& sources() const { return _sources; }

  /// Lets the active sources of a kind fire, each on its queue.
  void fire(MemoryPressureKind kind) {
    for (const auto& source : _sources)
      if (source->kind == kind && source->isActive) source->queue->dispatchAsync(source->handler);
  }

 private:
  class Handle final : public MemoryPressureSource {
   public:
    explicit Handle(std::shared_ptr<Source> source) : _source(std::move(source)) {}
    ~Handle() override { *_source = {_source->kind, nullptr, nullptr, false}; }
    void activate() override { _source->isActive = true; }
    void cancel() override { _source->isActive = false; }

   private:
    std::shared_ptr<Source> _source;
  };

  std::vector<std::shared_ptr<Source>> _sources;
};

}  // namespace nimbo
