#pragma once

#include <stop_token>

#include "desktop/gtfs/alerts/SelectorMatcher.h"
#include "desktop/gtfs/feeds/Feed.h"
#include "desktop/gtfs/feeds/FeedCache.h"
#include "desktop/gtfs/net/HTTPFetcher.h"
#include "desktop/gtfs/static/StaticFeedBuilder.h"

namespace nimbo {

/// A static feed as read from its source.
struct FreshStaticFeed {
  StaticFeed feed;
  TripRoutes trips;
  SkipReport skipped;
};

/// A static feed, however it came.
struct LoadedStaticFeed {
  StaticFeed feed;
  SelectorMatcher::TripLookup trips;  ///< reads the trips when first asked
};

/// Reads static feeds and keeps them parsed in the cache. A local source is read again when its files have changed, a
/// remote one is asked once a day. A damaged cache file counts as none. Blocks its thread; any thread.
class StaticFeedStore {
 public:
  explicit StaticFeedStore(FeedCache cache) : _cache(std::move(cache)) {}

  /// Hears how many bytes have come of how many; absent where the server does not say. Called on the thread that loads.
  using Progress = std::function<void(std::uint64_t received, std::optional<std::uint64_t> length)>;

  /// From the cache where that is as good as the source. A remote source that does not answer costs nothing but time
  /// while the cache has an older state. `stop` also ends a reading of the trips that comes later.
  Outcome<LoadedStaticFeed> load(const Feed& feed, const std::stop_token& stop, const Progress& progress = {}) const;

  /// What the cache has of a remote source, without asking that.
  struct Held {
    LoadedStaticFeed loaded;
    bool isDue;  ///< the source is to be asked again
  };
  /// Absent when the cache has nothing of this source.
  std::optional<Held> held(const Feed& feed, const std::stop_token& stop) const;

  /// How trips of this table are looked up.
  static SelectorMatcher::TripLookup lookupIn(const Feed& feed, const TripRoutes& trips);

  /// From the source.
  Outcome<FreshStaticFeed> readAnew(const Feed& feed, const std::stop_token& stop, const Progress& progress = {}) const;

 private:
  std::optional<StaticFeed> readCache(const Feed& feed) const;
  Outcome<LoadedStaticFeed> loadRemote(const Feed& feed, const std::optional<StaticFeed>& cached,
                                       const std::stop_token& stop, const Progress& progress) const;
  Outcome<std::optional<FreshStaticFeed>> fetch(const Feed& feed, const HTTPValidators& validators,
                                                const std::stop_token& stop, const Progress& progress) const;
  Outcome<std::optional<FreshStaticFeed>> fetchFrom(const Feed& feed, const FeedAddress& address,
                                                    const HTTPValidators& validators, const std::stop_token& stop,
                                                    const Progress& progress) const;
  Outcome<FreshStaticFeed> parse(StaticFeedFiles& files, const Feed& feed, const std::string& fingerprint) const;
  Outcome<TripRoutes> readTrips(const Feed& feed, const StaticFeed& staticFeed, const std::stop_token& stop) const;
  LoadedStaticFeed withTrips(const Feed& feed, StaticFeed staticFeed, std::optional<TripRoutes> trips,
                             const std::stop_token& stop) const;

  FeedCache _cache;
};

}  // namespace nimbo
