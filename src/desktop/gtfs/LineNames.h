#pragma once

#include <string>
#include <string_view>

#include "desktop/gtfs/StaticFeed.h"

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

}  // namespace nimbo
