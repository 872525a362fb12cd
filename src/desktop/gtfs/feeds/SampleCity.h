#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>

#include "desktop/gtfs/feeds/FeedSource.h"
#include "platform/foundation/Date.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// Writes alerts that are described in JSON, with times in seconds from `anchor`, as a GTFS-Realtime feed made at
/// `anchor`. The form is that of resources/sample-city/alerts.json, a part of the program: a mistake in it throws.
std::string alertsFeedBytes(const nlohmann::json& alerts, Date anchor);

/// The made-up city inside the program (resources/sample-city), which serves while no feed is set up: a dozen lines of
/// three agencies. Its incidents are in force, to come and over as seen from the moment it was made.
class SampleCity final : public FeedSource {
 public:
  /// Dates count from `now`, rounded down to the minute, so that they stand still while the city lives.
  explicit SampleCity(Date now);

  const std::string& name() const override { return _name; }
  bool minorAlerts() const override { return false; }
  Outcome<LoadedStaticFeed> staticFeed(const std::stop_token& stop) const override;
  /// Read from real GTFS-Realtime bytes.
  Outcome<std::optional<AlertsFeed>> alerts(AlertsState& state, bool needsFeed, Date notBefore,
                                            const std::stop_token& stop) const override;

  /// The favourites of a rider who has chosen none yet: some lines with incidents in force, two of them shared, and
  /// some without.
  static std::vector<TransitLineRef> favorites();

 private:
  std::string _name;
  Date _anchor;
};

}  // namespace nimbo
