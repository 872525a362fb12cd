#pragma once

#include <cstddef>
#include <string>

namespace nimbo {

inline constexpr std::size_t kMadeUpRoutes = 5000;
inline constexpr std::size_t kMadeUpAlerts = 5000;

/// routes.txt of 5000 routes of ten agencies: R0 to R4999, of agencies A0 to A9.
std::string madeUpRoutes();
/// agency.txt of the ten.
std::string madeUpAgencies();
/// A GTFS-Realtime feed of 5 MB: 5000 alerts in two languages, each on three routes and some stops. `now` in seconds
/// since 1970.
std::string madeUpAlerts(std::uint64_t now);

}  // namespace nimbo
