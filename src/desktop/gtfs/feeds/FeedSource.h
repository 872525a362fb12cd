#pragma once

#include <stop_token>
#include <string>

#include "desktop/gtfs/alerts/AlertsFeed.h"
#include "desktop/gtfs/alerts/AlertsStore.h"
#include "desktop/gtfs/static/StaticFeedDownloads.h"
#include "desktop/gtfs/static/StaticFeedStore.h"

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

/// A feed that the user set up.
class ConfiguredFeedSource final : public FeedSource {
 public:
  ConfiguredFeedSource(Feed feed, const FeedCache& cache, std::shared_ptr<StaticFeedDownloads> downloads)
      : _feed(std::move(feed)), _staticFeeds(std::move(downloads)), _alerts(cache) {}

  const std::string& name() const override { return _feed.name; }
  bool minorAlerts() const override { return _feed.minorAlerts; }
  Outcome<LoadedStaticFeed> staticFeed(const std::stop_token& stop) const override {
    return _staticFeeds->load(_feed, stop);
  }
  Outcome<AlertsFeed> alerts(const std::stop_token& stop) const override { return _alerts.load(_feed, stop); }

 private:
  Feed _feed;
  std::shared_ptr<StaticFeedDownloads> _staticFeeds;
  AlertsStore _alerts;
};

}  // namespace nimbo
