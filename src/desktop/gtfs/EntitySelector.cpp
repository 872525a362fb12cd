#include "desktop/gtfs/EntitySelector.h"

#include "desktop/gtfs/RealtimeFields.h"
#include "desktop/gtfs/RealtimeReading.h"

namespace nimbo {

namespace {

void readTrip(std::string_view body, EntitySelector& selector) {
  selector.hasTrip = true;
  for (auto trip = messageIn<TripDescriptorField>(body); trip.next();) {
    switch (trip.tag()) {
      case TripDescriptorField::tripID:
        selector.tripID = takeView(trip);
        break;
      case TripDescriptorField::routeID:
        selector.tripRouteID = takeView(trip);
        break;
      default:
        trip.skip();
    }
  }
}

}  // namespace

EntitySelector readEntitySelector(std::string_view body) {
  EntitySelector result;
  for (auto selector = messageIn<EntitySelectorField>(body); selector.next();) {
    switch (selector.tag()) {
      case EntitySelectorField::agencyID:
        result.agencyID = takeView(selector);
        break;
      case EntitySelectorField::routeID:
        result.routeID = takeView(selector);
        break;
      case EntitySelectorField::routeType:
        result.routeType = static_cast<RouteType>(takeNumber(selector));
        break;
      case EntitySelectorField::trip:
        readTrip(takeView(selector), result);
        break;
      case EntitySelectorField::stopID:
        result.hasStop = !takeView(selector).empty();
        break;
      case EntitySelectorField::directionID:
        result.hasDirection = true;
        selector.skip();
        break;
      default:
        selector.skip();
    }
  }
  return result;
}

}  // namespace nimbo
