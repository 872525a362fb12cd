#pragma once

#include <optional>
#include <string_view>

#include "desktop/gtfs/RouteType.h"

namespace nimbo {

/// What a part of an alert is about. Empty texts are absent fields; the texts are views of the feed.
struct EntitySelector {
  std::string_view agencyID;
  std::string_view routeID;
  std::optional<RouteType> routeType;
  std::string_view tripID;
  std::string_view tripRouteID;
  bool hasStop = false;
  bool hasTrip = false;
  bool hasDirection = false;
};

/// Reads an EntitySelector message. Throws protozero::exception for damaged bytes.
EntitySelector readEntitySelector(std::string_view body);

}  // namespace nimbo
