#pragma once

#include <filesystem>
#include <optional>
#include <stop_token>
#include <string>

#include "desktop/gtfs/alerts/AlertsFeed.h"
#include "desktop/gtfs/feeds/Feed.h"
#include "desktop/gtfs/feeds/FeedCache.h"
#include "desktop/gtfs/net/HTTPFetcher.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// The last good answer of an alerts feed's server, kept in the cache: for conditional requests, and to stand in for a
/// while when the server fails.
struct KeptAlerts {
  std::string address;
  HTTPValidators validators;
  Date fetchedAt;  ///< when the server last said that this is the present state
  std::string body;

  /// Absent when there is none at `path`, it is damaged, or of another address.
  static std::optional<KeptAlerts> read(const std::filesystem::path& path, const FeedAddress& address);
  /// Replaces what is kept. Null on success.
  ErrorRef write(const std::filesystem::path& path) const;
};

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
