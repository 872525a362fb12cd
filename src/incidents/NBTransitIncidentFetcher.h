#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <vector>

#include "incidents/Result.h"
#include "platform/transit/TransitLine.h"

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

class _NBTransitIncidentFetcherRequest;

/// Fetches the user's favourite lines as they are now, with their incidents: reads the favourites, then looks all
/// lines up at once. Held by shared pointer; may be dropped at once, a running fetch holds what it needs.
class NBTransitIncidentFetcher final : public Object {
 public:
  /// Starts a fetch. Its result is an array of `TransitLineItem`s, empty without favourite lines, or the error of the
  /// line service as it came. The handler, which may be empty, is called on the main thread, never before this returns.
  /// Main thread only.
  std::shared_ptr<NBTransitIncidentFetcherRequest> fetchFavoriteLinesTransitIncidentsWithCompletionHandler(
      NBTransitIncidentFetcherHandler handler);

  std::string_view className() const override { return "NBTransitIncidentFetcher"; }

 private:
  void _fetchIncidentsForLines_withRequest(const std::vector<TransitLineRef>& lines,
                                           std::shared_ptr<_NBTransitIncidentFetcherRequest> request);
  /// The items in their order, some of those without incidents replaced by lines with made-up ones.
  TransitLineItems _fakeLineItemsFromItems(const TransitLineItems& items) const;
};

}  // namespace nimbo
