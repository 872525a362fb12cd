#pragma once

#include <string>
#include <string_view>

namespace nimbo {

/// Identifier of the map application that the widget belongs to: prefix of its activities and queue labels.
inline constexpr std::string_view kHostApplicationIdentifier = "org.nimbo.Map";

/// URL scheme that the map application opens.
inline constexpr std::string_view kHostApplicationURLScheme = "nimbo";

/// Activity that opens the map application at one line.
inline const std::string kNimboTransitWidgetIncidentActivityType =
    std::string(kHostApplicationIdentifier) + ".Transit.Incident";

/// User-info key of the line: a bzip2 stream of an activity record.
inline constexpr std::string_view kNimboTransitWidgetIncidentActivityUserInfoKey = "bs";

/// Activity that opens the map application at a list of incidents.
inline const std::string kNimboTransitWidgetIncidentSummaryActivityType =
    std::string(kHostApplicationIdentifier) + ".Transit.IncidentList";

/// User-info key of the list's incidents: a keyed archive.
inline constexpr std::string_view kNimboTransitWidgetIncidentSummaryActivityUserInfoKey = "incidentListKey";

/// Logging subsystem of the map application's suggestions, to which the memory-pressure signposts belong.
inline constexpr std::string_view kHostSuggestionsLogSubsystem = "org.nimbo.Map.suggestions";

}  // namespace nimbo
