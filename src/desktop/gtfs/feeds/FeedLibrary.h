#pragma once

#include <memory>
#include <mutex>
#include <vector>

#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/feeds/FeedSource.h"
#include "desktop/gtfs/static/StaticFeedDownloads.h"
#include "desktop/system/Paths.h"

namespace nimbo {

using FeedSourceRef = std::shared_ptr<const FeedSource>;

/// The feeds that serve: those that the user set up, or the sample city while there are none. Any thread.
class FeedLibrary {
 public:
  explicit FeedLibrary(const Paths& paths)
      : _configuration(paths.config),
        _cache(paths.cache),
        _users(std::make_shared<CacheUsers>(paths.cache)),
        _downloads(std::make_shared<StaticFeedDownloads>(FeedCache(paths.cache))) {}

  /// In the user's order, by the configuration as it is now.
  Outcome<std::vector<FeedSourceRef>> sources() const;
  /// The source of this name, or an error that says what to do.
  Outcome<FeedSourceRef> sourceNamed(std::string_view name) const;

  const FeedConfiguration& configuration() const { return _configuration; }
  const FeedCache& cache() const { return _cache; }
  /// The static feeds of servers, which may still be coming when an answer is due.
  const StaticFeedDownloads& downloads() const { return *_downloads; }

 private:
  FeedSourceRef sampleCity() const;

  FeedConfiguration _configuration;
  FeedCache _cache;
  std::shared_ptr<CacheUsers> _users;
  std::shared_ptr<StaticFeedDownloads> _downloads;
  mutable std::mutex _lock;
  mutable FeedSourceRef _sampleCity;  // made when first needed; its dates begin then
};

}  // namespace nimbo
