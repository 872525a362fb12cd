#pragma once

#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "desktop/gtfs/static/StaticFeedStore.h"

namespace nimbo {

/// Static feeds for those who must not wait for a server: a remote feed that the cache has is given from there, however
/// old, and its server asked behind that; one that the cache does not have is waited for, and goes on coming when
/// nobody waits any more. One download a feed; those who ask meanwhile join it. A server that is asked in vain is asked
/// again after 15 minutes, then each time after twice as long, at most a day. Any thread.
class StaticFeedDownloads {
 public:
  explicit StaticFeedDownloads(const FeedCache& cache) : _cache(cache), _store(cache) {}
  /// Ends what is still coming.
  ~StaticFeedDownloads();

  /// Blocks its thread while the feed is not in the cache, until `stop` is requested: then the error is that of
  /// `firstUnderWay`. Throws std::system_error when a feed that is not in the cache needs a thread that cannot start.
  Outcome<LoadedStaticFeed> load(const Feed& feed, const std::stop_token& stop);

  /// A download that has not ended.
  struct Progress {
    std::string feed;
    std::uint64_t received = 0;                ///< bytes
    std::optional<std::uint64_t> length = {};  ///< bytes that it has; absent where its server does not say
  };
  /// The downloads under way, of feeds that were here before too.
  std::vector<Progress> underWay() const;

  /// An error that says of a feed which was never here how far it is; null when none is coming.
  ErrorRef firstUnderWay() const;

 private:
  struct Download;
  std::shared_ptr<Download> join(const Feed& feed, bool isHeld);
  void dropFinished(const Feed& feed);
  bool mayAsk(const Feed& feed) const;

  FeedCache _cache;
  StaticFeedStore _store;
  mutable std::mutex _lock;
  std::map<std::string, std::shared_ptr<Download>> _downloads;  // by the names of their feeds
};

}  // namespace nimbo
