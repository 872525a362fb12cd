#pragma once

#include <string>
#include <string_view>

#include "desktop/gtfs/StaticFeed.h"
#include "platform/transit/MapItemIdentifier.h"

namespace nimbo {

/// The short name, else the long one; empty for a line without names.
inline std::string_view nameOfLine(const StaticLine& line) {
  return line.shortName.empty() ? line.longName : line.shortName;
}

/// Short and long name, as they are read out: "7, Airport Express"; one where there is only one.
inline std::string fullNameOfLine(const StaticLine& line) {
  std::string name(nameOfLine(line));
  if (!line.shortName.empty() && !line.longName.empty() && line.longName != line.shortName)
    name.append(", ").append(line.longName);
  return name;
}

/// A line as its user writes it, "FEED:ROUTE_ID"; its number where only that is known.
inline std::string writtenNameOfLine(const MapItemIdentifier& identifier) {
  const auto& locator = identifier.locator();
  return locator ? locator->feed + ":" + locator->routeID : std::to_string(identifier.muid());
}

}  // namespace nimbo
