#pragma once

#include <string>
#include <vector>

#include "host/HostPlatform.h"

namespace nimbo {

/// A favourite line with what is known of it.
struct KnownLine {
  std::string id;  ///< "FEED:ROUTE_ID"
  std::string name;
  std::string agency;  ///< empty where that is not known
  std::string state;   ///< how it runs, in the user's language
};

/// The favourites in their order, each by the last fetch of any process, without a fetch; none of them while the sample
/// city serves. What was looked up more than `kFreshFor` ago says so, and good service is said of no such line.
/// Main thread.
std::vector<KnownLine> knownFavorites(HostPlatform& platform, const std::string& locale);

/// Seconds.
inline constexpr TimeInterval kFreshFor = 900;

/// Whether each of the words is in the line's name, agency or identifier, as searches compare texts.
bool hasWords(const KnownLine& line, const std::vector<std::string>& words);

}  // namespace nimbo
