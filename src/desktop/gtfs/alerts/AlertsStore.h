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
  std::string address;  ///< its identity
  HTTPValidators validators;
  Date fetchedAt;  ///< when the server last said that this is the present state
  Date changedAt;  ///< when the body was first seen
  std::string body;

  /// Absent when there is none at `path`, it is damaged, or of another address.
  static std::optional<KeptAlerts> read(const std::filesystem::path& path, const FeedAddress& address);
  /// Replaces what is kept. Null on success.
  ErrorRef write(const std::filesystem::path& path) const;
};

/// The alerts of a feed, and how old they are.
struct FetchedAlerts {
  AlertsFeed feed;
  /// By the header; where that says nothing, by Last-Modified or the file's own time, else by when the bytes were first
  /// seen.
  Date madeAt;
};

/// Gets the present alerts of a feed. They count for as long after they were made as the feed's setting says: by
/// default a quarter of an hour for an answer of a server, and a day for a file, which somebody has to put there. An
/// answer whose header does not say when it was made counts for seven days. None is older than the one held. Blocks its
/// thread; any thread.
class AlertsStore {
 public:
  explicit AlertsStore(FeedCache cache) : _cache(std::move(cache)) {}

  /// The present alerts. When the server fails, the last answer stands in for at most 15 minutes.
  Outcome<AlertsFeed> load(const Feed& feed, const std::stop_token& stop) const;

  /// What the source says now, however old.
  Outcome<FetchedAlerts> fetch(const Feed& feed, const std::stop_token& stop) const;

  /// Null when the alerts are near enough to now for the feed's setting. Ones that are as far ahead are no better than
  /// old ones: by a clock that is wrong, an incident in force counts as one to come.
  static ErrorRef staleness(const Feed& feed, const FetchedAlerts& alerts);

 private:
  Outcome<FetchedAlerts> readLocal(const Feed& feed) const;

  FeedCache _cache;
};

}  // namespace nimbo
