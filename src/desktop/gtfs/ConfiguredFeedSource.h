#pragma once

#include "desktop/gtfs/AlertsStore.h"
#include "desktop/gtfs/FeedSource.h"

namespace nimbo {

/// A feed that the user set up.
class ConfiguredFeedSource final : public FeedSource {
 public:
  ConfiguredFeedSource(Feed feed, const FeedCache& cache)
      : _feed(std::move(feed)), _staticFeeds(cache), _alerts(cache) {}

  const std::string& name() const override { return _feed.name; }
  bool minorAlerts() const override { return _feed.minorAlerts; }
  Outcome<LoadedStaticFeed> staticFeed(const std::stop_token& stop) const override {
    return _staticFeeds.load(_feed, stop);
  }
  Outcome<AlertsFeed> alerts(const std::stop_token& stop) const override { return _alerts.load(_feed, stop); }

 private:
  Feed _feed;
  StaticFeedStore _staticFeeds;
  AlertsStore _alerts;
};

}  // namespace nimbo
