#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "platform/foundation/Date.h"
#include "protocol/Shield.h"

namespace nimbo::protocol {

/// An incident, for one of its periods.
struct Incident {
  std::uint64_t muid = 0;
  std::optional<std::string> title;
  std::optional<std::string> summary;
  std::optional<std::string> fullDescription;
  std::optional<Date> startDate;  ///< absent: it began some time ago
  std::optional<Date> endDate;    ///< absent: until further notice
  std::optional<Date> lastUpdated;
  bool isBlocking = false;
  std::vector<std::uint64_t> affectedLines;  ///< their numbers
  std::optional<std::string> linkURL;
};

/// The network that a line belongs to.
struct System {
  std::optional<std::string> name;
  std::optional<Shield> artwork;
};

/// A line with what happens on it.
struct Line {
  std::uint64_t muid = 0;
  std::optional<std::string> name;
  std::optional<System> system;
  std::optional<Shield> artwork;
  std::optional<Shield> alternateArtwork;  ///< as rows show it
  std::vector<Incident> incidents;
};

/// What the host has of a hand-off, or of a saved state.
struct DecodeParams {
  std::string bytes;  ///< Base64
};

/// What these bytes hold.
struct Handoff {
  std::string text;                                ///< all of it as indented JSON, for people
  std::optional<Line> line;                        ///< of the activity of a line
  std::optional<std::vector<Incident>> incidents;  ///< of the activity of a list
};

}  // namespace nimbo::protocol
