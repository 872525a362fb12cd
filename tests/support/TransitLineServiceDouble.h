#pragma once

#include <deque>
#include <mutex>

#include "platform/TransitLineService.h"
#include "support/TestRunLoop.h"

namespace nimbo {

/// Records lookups, which wait for the test's answer. Lookups come from any thread; the rest is the test's.
class TransitLineServiceDouble final : public TransitLineService {
 public:
  explicit TransitLineServiceDouble(TestRunLoop& loop) : _loop(loop) {}

  void lookup(const std::vector<MapItemIdentifierRef>& identifiers, Handler handler) override {
    {
      const std::lock_guard guard(_lock);
      std::vector<std::uint64_t>& muids = _lookups.emplace_back();
      for (const auto& identifier : identifiers) muids.push_back(identifier->muid());
      _handlers.push_back(std::move(handler));
    }
    _loop.wake();
  }

  /// The numbers of the identifiers of each lookup so far.
  std::vector<std::vector<std::uint64_t>> lookups() const {
    const std::lock_guard guard(_lock);
    return _lookups;
  }

  /// Lookups without an answer.
  std::size_t pending() const {
    const std::lock_guard guard(_lock);
    return _handlers.size();
  }

  /// Queues the answer to the oldest lookup that has none; there is one.
  void answer(TransitLineItems items, ErrorRef error = nullptr) {
    const std::lock_guard guard(_lock);
    _loop.dispatchAsync([handler = std::move(_handlers.at(0)), items, error] { handler(items, error); });
    _handlers.pop_front();
  }

 private:
  TestRunLoop& _loop;
  mutable std::mutex _lock;
  std::vector<std::vector<std::uint64_t>> _lookups;
  std::deque<Handler> _handlers;
};

}  // namespace nimbo
