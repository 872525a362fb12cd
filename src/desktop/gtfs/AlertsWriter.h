#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>

#include "platform/foundation/Date.h"

namespace nimbo {

/// Writes alerts that are described in JSON, with times in seconds from `anchor`, as a GTFS-Realtime feed made at
/// `anchor`. The form is that of resources/sample-city/alerts.json, a part of the program: a mistake in it throws.
std::string alertsFeedBytes(const nlohmann::json& alerts, Date anchor);

}  // namespace nimbo
