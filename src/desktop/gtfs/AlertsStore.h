#pragma once

#include <stop_token>

#include "desktop/gtfs/AlertsFeed.h"
#include "desktop/gtfs/Feed.h"
#include "desktop/gtfs/FeedCache.h"

namespace nimbo {

/// Gets the present alerts of a feed. A file counts as present whenever it can be read: it is what the user gave. An
/// answer of a server counts for as long after its own timestamp as the feed's setting says, and is never older than
/// the one held. Blocks its thread; any thread.
class AlertsStore {
 public:
  explicit AlertsStore(FeedCache cache) : _cache(std::move(cache)) {}

  /// The present alerts. When the server fails, the last answer stands in for at most 15 minutes.
  Outcome<AlertsFeed> load(const Feed& feed, const std::stop_token& stop) const;

  /// What the source says now, however old.
  Outcome<AlertsFeed> fetch(const Feed& feed, const std::stop_token& stop) const;

  /// Null when the feed's own timestamp is near enough for its setting, or missing; also for a file. One that is as far
  /// ahead is no better than an old one: by a clock that is wrong, an incident in force counts as one to come.
  static ErrorRef staleness(const Feed& feed, const AlertsFeed& alerts);

 private:
  FeedCache _cache;
};

}  // namespace nimbo
