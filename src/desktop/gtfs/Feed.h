#pragma once

#include <chrono>
#include <string>

#include "desktop/gtfs/FeedAddress.h"

namespace nimbo {

/// How old what a publisher says, or how far ahead its date, may be before it is no more taken for the present state.
inline constexpr std::chrono::minutes kDefaultMaximumAlertsAge{15};

/// A feed as the user set it up.
struct Feed {
  std::string name;
  FeedAddress staticFeed;  ///< a folder, a zip file or the address of one
  FeedAddress alerts;      ///< a file or an address
  /// Whether alerts without effect on the service, and those about accessibility alone, are incidents too.
  bool minorAlerts = false;
  /// How long after its header's timestamp an answer of a server counts; a file counts as long as it can be read.
  std::chrono::minutes maximumAlertsAge = kDefaultMaximumAlertsAge;

  bool operator==(const Feed&) const = default;
};

}  // namespace nimbo
