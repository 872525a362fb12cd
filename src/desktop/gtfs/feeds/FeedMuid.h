#pragma once

#include <string_view>

#include "platform/foundation/Hash.h"

namespace nimbo {

// Numbers of what a feed holds, made from the feed's name and the publisher's own identifiers alone, so that they are
// the same in every run, on every machine and in whatever order a feed lists things.

inline std::uint64_t feedMuid(std::string_view kind, std::string_view feed, std::string_view identifier) {
  const std::string_view separator("\0", 1);
  std::uint64_t hash = hashOfBytes(kind);
  for (const std::string_view part : {separator, feed, separator, identifier}) hash = hashOfBytes(part, hash);
  return hash;
}

inline std::uint64_t lineMuid(std::string_view feed, std::string_view routeID) {
  return feedMuid("line", feed, routeID);
}
inline std::uint64_t systemMuid(std::string_view feed, std::string_view agencyID) {
  return feedMuid("system", feed, agencyID);
}
inline std::uint64_t incidentMuid(std::string_view feed, std::string_view alertID) {
  return feedMuid("incident", feed, alertID);
}

}  // namespace nimbo
