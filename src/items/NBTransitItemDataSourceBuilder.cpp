#include "items/NBTransitItemDataSourceBuilder.h"

#include <stdexcept>

#include "items/NBTransitIncidentDataSourceErrorBuilder.h"
#include "items/NBTransitIncidentsDataSourceBuilder.h"

namespace nimbo {

std::shared_ptr<NBTransitItemDataSourceBuilder> NBTransitDataSourceBuilderForResult(
    const ResultRef& result, std::uint64_t maxNumberOfItems, std::shared_ptr<ArtworkCache> artworkCache,
    std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> analytics) {
  std::shared_ptr<NBTransitItemDataSourceBuilder> builder;
  result->withValue_orError(
      [&](const ObjectRef& value) {
        const auto* array = dynamic_cast<const BoxedArray*>(value.get());
        if (!array) throw std::invalid_argument("a result of line items holds an array");
        builder = NBTransitIncidentsDataSourceBuilder::initWithLineItems_maxNumberOfItems_artworkCache_analytics(
            array->elementsOfClass<TransitLineItem>(), maxNumberOfItems, std::move(artworkCache), std::move(analytics));
      },
      [&](const ErrorRef& error) { builder = NBTransitIncidentDataSourceErrorBuilder::initWithError(error); });
  return builder;
}

}  // namespace nimbo
