#pragma once

#include <nlohmann/json.hpp>
#include <optional>

#include "platform/foundation/Date.h"

namespace nimbo {

// Dates as the state database's JSON has them: microseconds since 1970; null for none.

inline nlohmann::json jsonOfDate(std::optional<Date> date) {
  return date ? nlohmann::json(date->time_since_epoch().count()) : nlohmann::json();
}

/// Throws nlohmann::json::exception for anything else.
inline std::optional<Date> dateOfJSON(const nlohmann::json& date) {
  return date.is_null() ? std::nullopt : std::optional(Date(std::chrono::microseconds(date.get<std::int64_t>())));
}

}  // namespace nimbo
