#pragma once

#include <algorithm>

#include "platform/foundation/Date.h"

namespace nimbo {

/// How long to wait before the next of several attempts: each time twice as long as the time before.
class Backoff {
 public:
  /// `first` and `most` in seconds, 0 < first <= most.
  Backoff(TimeInterval first, TimeInterval most) : _first(first), _most(most), _next(first) {}

  TimeInterval next() {
    const TimeInterval wait = _next;
    _next = std::min(2 * _next, _most);
    return wait;
  }
  /// An attempt succeeded: the next wait is the first one again.
  void reset() { _next = _first; }

 private:
  TimeInterval _first, _most, _next;
};

}  // namespace nimbo
