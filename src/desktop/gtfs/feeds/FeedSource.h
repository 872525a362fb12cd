#pragma once

#include <algorithm>
#include <functional>
#include <mutex>
#include <optional>
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
  /// The present alerts, fresh enough to say "good service" by: as `AlertsStore::load`.
  virtual Outcome<std::optional<AlertsFeed>> alerts(AlertsState& state, bool needsFeed, Date notBefore,
                                                    const std::stop_token& stop) const = 0;
  /// Whether another feed that is read by the same alerts has a route.
  virtual std::function<bool(std::string_view routeID)> isRouteOfOther(const std::stop_token&) const { return {}; }
};

/// Alerts that several feeds are read by, fetched and read once for them all. Any thread.
class SharedAlerts {
 public:
  Outcome<std::optional<AlertsFeed>> load(const AlertsStore& store, const Feed& feed, AlertsState& state,
                                          Date notBefore, const std::stop_token& stop) {
    const std::lock_guard guard(_lock);
    if (!_alerts) {
      _alerts = store.load(feed, state, true, stop, notBefore);
      _state = state;
    } else {
      state = _state;
      if (state.feed) state.feed = feed;
    }
    return *_alerts;
  }

 private:
  std::mutex _lock;
  std::optional<Outcome<std::optional<AlertsFeed>>> _alerts;
  AlertsState _state;
};

/// A feed that the user set up.
class ConfiguredFeedSource final : public FeedSource {
 public:
  /// `shared` is one for all feeds that are read by these alerts.
  ConfiguredFeedSource(Feed feed, const FeedCache& cache, std::shared_ptr<CacheUsers> users,
                       std::shared_ptr<StaticFeedDownloads> downloads, std::shared_ptr<SharedAlerts> shared)
      : _feed(std::move(feed)),
        _staticFeeds(std::move(downloads)),
        _alerts(cache, std::move(users)),
        _shared(std::move(shared)) {}

  const std::string& name() const override { return _feed.name; }
  bool minorAlerts() const override { return _feed.minorAlerts; }
  Outcome<LoadedStaticFeed> staticFeed(const std::stop_token& stop) const override {
    return _staticFeeds->load(_feed, stop);
  }
  Outcome<std::optional<AlertsFeed>> alerts(AlertsState& state, bool needsFeed, Date notBefore,
                                            const std::stop_token& stop) const override {
    return _feed.siblings.empty() ? _alerts.load(_feed, state, needsFeed, stop, notBefore)
                                  : _shared->load(_alerts, _feed, state, notBefore, stop);
  }
  std::function<bool(std::string_view routeID)> isRouteOfOther(const std::stop_token& stop) const override {
    if (_feed.siblings.empty()) return {};
    return [this, stop](std::string_view routeID) {
      return std::any_of(_feed.siblings.begin(), _feed.siblings.end(), [&](const Feed& sibling) {
        const auto loaded = _staticFeeds->load(sibling, stop);
        return loaded && loaded->feed.hasRoute(routeID);
      });
    };
  }

 private:
  Feed _feed;
  std::shared_ptr<StaticFeedDownloads> _staticFeeds;
  AlertsStore _alerts;
  std::shared_ptr<SharedAlerts> _shared;
};

}  // namespace nimbo
