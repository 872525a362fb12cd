#pragma once

#include <memory>
#include <vector>

#include "incidents/NBTransitIncidentFetcherRequest.h"
#include "platform/transit/TransitLineItem.h"

namespace nimbo {

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
