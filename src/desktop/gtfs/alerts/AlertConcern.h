#pragma once

#include <string>
#include <string_view>

#include "desktop/gtfs/alerts/RealtimeFields.h"

namespace nimbo {

/// What an alert means for riders of its lines, the least first.
enum class AlertConcern { none, additionalService, other, detour, delays, reducedService, noService };

/// By the detail of the effect where that is a word that publishers use, such as "DELAY" or "Elevator closure", else by
/// the effect. `detail` may be empty.
AlertConcern concernOf(AlertEffect effect, std::string_view detail);

/// The detail of an Alert message's effect, in the words in which details are known; empty without one. Throws
/// protozero::exception for damaged bytes.
std::string effectDetailIn(std::string_view alert);

}  // namespace nimbo
