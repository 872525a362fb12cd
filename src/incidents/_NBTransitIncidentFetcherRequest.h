#pragma once

#include <memory>
#include <mutex>
#include <vector>

#include "incidents/NBTransitIncidentFetcherRequest.h"

namespace nimbo {

/// The fetcher's side of a request: it delivers the result, once.
class _NBTransitIncidentFetcherRequest final : public Object, public NBTransitIncidentFetcherRequest {
 public:
  /// The handler may be empty.
  static std::shared_ptr<_NBTransitIncidentFetcherRequest> initWithCompletionHandler(
      NBTransitIncidentFetcherHandler handler);

  void addHandler(NBTransitIncidentFetcherHandler handler) override;
  ResultRef result() const override;

  /// The handlers so far, in the order in which they were added. Any thread.
  std::vector<NBTransitIncidentFetcherHandler> handlers() const;

  /// Stores the result and calls the handlers with it, in order, before it returns. A handler may use the request.
  void setResultAndInvokeCompletionHandlers(ResultRef result);

  std::string_view className() const override { return "_NBTransitIncidentFetcherRequest"; }

 private:
  mutable std::mutex _lock;  // guards both
  std::vector<NBTransitIncidentFetcherHandler> _handlers;
  ResultRef _result;
};

}  // namespace nimbo
