#include "handoff/DirectionsPlan.h"

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<DirectionsPlanFields> {
  static constexpr std::tuple fields{Field{1, "routeRequestStorage", &DirectionsPlanFields::routeRequestStorage},
                                     Field{2, "originString", &DirectionsPlanFields::originString},
                                     Field{3, "destinationString", &DirectionsPlanFields::destinationString},
                                     Field{4, "departureTime", &DirectionsPlanFields::departureTime},
                                     Field{5, "arrivalTime", &DirectionsPlanFields::arrivalTime},
                                     Field{6, "currentRouteIndex", &DirectionsPlanFields::currentRouteIndex},
                                     Field{7, "currentRouteStep", &DirectionsPlanFields::currentRouteStep},
                                     Field{8, "displayMethod", &DirectionsPlanFields::displayMethod},
                                     Field{9, "transitPreferences", &DirectionsPlanFields::transitPreferences},
                                     Field{10, "routesPerInitialPage", &DirectionsPlanFields::routesPerInitialPage},
                                     Field{11, "earlierPagesLoaded", &DirectionsPlanFields::earlierPagesLoaded},
                                     Field{12, "laterPagesLoaded", &DirectionsPlanFields::laterPagesLoaded},
                                     Field{13, "routesPerEarlierPage", &DirectionsPlanFields::routesPerEarlierPage},
                                     Field{14, "routesPerLaterPage", &DirectionsPlanFields::routesPerLaterPage},
                                     Field{15, "transitPrioritization", &DirectionsPlanFields::transitPrioritization},
                                     Field{16, "transitSurchargeOption", &DirectionsPlanFields::transitSurchargeOption},
                                     Field{17, "expiryTime", &DirectionsPlanFields::expiryTime},
                                     Field{404, "isPlayingTrace", &DirectionsPlanFields::isPlayingTrace}};
};

template class Record<DirectionsPlan, DirectionsPlanFields>;

bool DirectionsPlan::readFrom(ProtobufReader& reader) { return DirectionsPlanReadFrom(*this, reader); }

bool DirectionsPlanReadFrom(DirectionsPlan& plan, ProtobufReader& reader) { return plan.Record::readFrom(reader); }

}  // namespace nimbo
