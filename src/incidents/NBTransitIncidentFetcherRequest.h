#pragma once

#include <functional>

#include "incidents/Result.h"

namespace nimbo {

/// Hears the outcome of a fetch. Never gets a null result.
using NBTransitIncidentFetcherHandler = std::function<void(const ResultRef& result)>;

/// A fetch that runs or has ended. Any thread.
class NBTransitIncidentFetcherRequest {
 public:
  virtual ~NBTransitIncidentFetcherRequest() = default;

  /// While the fetch runs, the handler is called when it ends, on the main thread, after those added before; once it
  /// has ended, at once, on the calling thread. An empty handler is ignored.
  virtual void addHandler(NBTransitIncidentFetcherHandler handler) = 0;

  /// Null while the fetch runs.
  virtual ResultRef result() const = 0;
};

}  // namespace nimbo
