#pragma once

#include <cstdint>
#include <memory>

#include "incidents/Result.h"
#include "items/NBTransitListItem.h"
#include "platform/artwork/ArtworkCache.h"

namespace nimbo {

/// Makes what the widget shows of one fetch result. Lives for one rebuild; main thread only.
class NBTransitItemDataSourceBuilder : public Object {
 public:
  /// Built on the first call, the same object on every later one. Never null.
  virtual const NBTransitListItemRef& listItem() = 0;
};

class NBTransitIncidentsAnalyticsDelegate;

/// The builder for a fetch result: of rows for an array of `TransitLineItem`s, of the error row for an error. Throws
/// std::invalid_argument for a value that is no array. `maxNumberOfItems` of 0 is no limit; `analytics` may be null.
std::shared_ptr<NBTransitItemDataSourceBuilder> NBTransitDataSourceBuilderForResult(
    const ResultRef& result, std::uint64_t maxNumberOfItems, std::shared_ptr<ArtworkCache> artworkCache,
    std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> analytics);

}  // namespace nimbo
