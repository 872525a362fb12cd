#pragma once

#include "platform/transit/TransitArtwork.h"

namespace nimbo {

/// A GTFS route_type. Sources: https://gtfs.org/documentation/schedule/reference/#routestxt (0 to 12) and
/// https://developers.google.com/transit/gtfs/reference/extended-route-types (100 to 1799).
using RouteType = int;

/// A line whose route type is missing or no number.
inline constexpr RouteType kUnknownRouteType = -1;

/// The basic type whose extended range holds `type`: 7xx are buses (3). A basic or unknown type is its own.
RouteType basicRouteType(RouteType type);

/// Whether a selector for all lines of `selected` means a line of `type`: the same type, or a basic type and one of
/// its extended ones. 700, which stands for buses as such, also means the basic type; 714 means no other.
bool routeTypeCovers(RouteType selected, RouteType type);

/// Absent knowledge gives TransitMode::unknown.
TransitMode modeOfRouteType(RouteType type);

}  // namespace nimbo
