#include "desktop/gtfs/RouteType.h"

namespace nimbo {

RouteType basicRouteType(RouteType type) {
  switch (type / 100) {
    case 1:
    case 3:  // suburban railway
      return 2;
    case 2:
    case 7:
      return 3;
    case 4:
    case 5:
    case 6:
      return type == 405 ? 12 : 1;
    case 8:
      return 11;
    case 9:
      return 0;
    case 10:
    case 12:
      return 4;
    case 13:
      return 6;
    case 14:
      return 7;
    default:
      return type;
  }
}

bool routeTypeCovers(RouteType selected, RouteType type) {
  if (selected == type || selected == basicRouteType(type)) return true;
  return selected % 100 == 0 && basicRouteType(selected) == type;
}

TransitMode modeOfRouteType(RouteType type) {
  switch (basicRouteType(type)) {
    case 0:
      return TransitMode::tram;
    case 1:
      return TransitMode::subway;
    case 2:
      return TransitMode::rail;
    case 3:
      return TransitMode::bus;
    case 4:
      return TransitMode::ferry;
    case 5:
      return TransitMode::cableTram;
    case 6:
      return TransitMode::aerialLift;
    case 7:
      return TransitMode::funicular;
    case 11:
      return TransitMode::trolleybus;
    case 12:
      return TransitMode::monorail;
    default:
      return TransitMode::unknown;
  }
}

}  // namespace nimbo
