#pragma once

#include "desktop/gtfs/feeds/GTFSTransitLineService.h"
#include "desktop/store/FavoritesEditor.h"
#include "desktop/store/SeenIncidents.h"
#include "protocol/Lines.h"

namespace nimbo {

/// What the last lookup found out of each favorite line. A favorite that it did not ask for is unknown, as is every one
/// that is left of damaged favorites. Texts of all incidents take 1.5 MiB at most; incidents beyond that are left out.
/// Without `texts` incidents have none, as of LinesParams.
protocol::Lines lineReports(const FavoritesEditor& favorites, const GTFSTransitLineService& service,
                            const SeenForms& seen, bool texts);

/// The incidents that the last lookup found, in their present form, by their numbers.
std::map<std::uint64_t, IncidentForm> incidentForms(const GTFSTransitLineService& service);

}  // namespace nimbo
