#pragma once

#include <stop_token>
#include <string>

#include "desktop/gtfs/AlertsFeed.h"
#include "desktop/gtfs/StaticFeedStore.h"

namespace nimbo {

/// A feed that lines and alerts come from. Blocks its thread; any thread.
class FeedSource {
 public:
  virtual ~FeedSource() = default;

  virtual const std::string& name() const = 0;
  /// Whether alerts that change nothing for most riders count too.
  virtual bool minorAlerts() const = 0;
  virtual Outcome<LoadedStaticFeed> staticFeed(const std::stop_token& stop) const = 0;
  /// The present alerts, fresh enough to say "good service" by.
  virtual Outcome<AlertsFeed> alerts(const std::stop_token& stop) const = 0;
};

}  // namespace nimbo
