#pragma once

#include <filesystem>
#include <memory>
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

/// What is known of a feed's last answer, for who asks again: a feed that does not change costs next to nothing.
struct AlertsState {
  std::optional<Feed> feed = {};       ///< whose answer it was; absent before the first
  std::uint64_t hash = 0;              ///< of the answer's bytes
  std::size_t size = 0;                ///< how many they were
  HTTPValidators validators = {};      ///< of a server's answer
  std::optional<Date> timestamp = {};  ///< when the publisher made it; absent when he does not say
  /// By the timestamp; without one, by Last-Modified or the file's own time, else by when the bytes were first seen.
  Date madeAt = {};
  Date fetchedAt = {};    ///< when the server last said that this is the present state
  Date changedAt = {};    ///< when the bytes were first seen
  Date writtenAt = {};    ///< when this process last wrote the cache for this feed
  std::string file = {};  ///< the cache file as it was left with these bytes (fileFingerprint); empty without them
  bool isShared = false;  ///< the last load took an answer that was there, of whichever process
};

/// Gets the present alerts of a feed. They count for as long after they were made as the feed's setting says: by
/// default a quarter of an hour for an answer of a server, and a day for a file, which somebody has to put there. An
/// answer whose header does not say when it was made counts for seven days. None is older than the one held. Blocks its
/// thread; any thread.
///
/// The last good answer of a server is kept in the cache, which is written when an answer differs from the one before,
/// and at most every ten minutes while no other process goes by it; its file is as old as the server's last word that
/// this is the present state. So all processes with a cache share what one of them was answered, and what a server
/// wishes: for how long an answer serves, and, once it has failed, when it is to be asked again (ServerWishes.h).
class AlertsStore {
 public:
  /// Without `users` no other process goes by the cache.
  explicit AlertsStore(FeedCache cache, std::shared_ptr<CacheUsers> users = nullptr)
      : _cache(std::move(cache)), _users(std::move(users)) {}

  /// Asks the server whatever was answered before.
  static constexpr Date kNow = Date::max();

  /// The present alerts; absent when their bytes are those of `state` and the feed is not needed (`needsFeed`). An
  /// answer that is no older than `notBefore` and 15 minutes, or that its server lets serve still, is taken without
  /// asking, unless it is stale. When the server fails, or does not want to be asked yet, the last answer stands in for
  /// at most 15 minutes. `state` is that of the last call for this feed, and becomes that of this one.
  Outcome<std::optional<AlertsFeed>> load(const Feed& feed, AlertsState& state, bool needsFeed,
                                          const std::stop_token& stop, Date notBefore = kNow) const;

  /// The same of what the source says now, however old, but from a server that does not want to be asked yet.
  Outcome<std::optional<AlertsFeed>> fetch(const Feed& feed, AlertsState& state, bool needsFeed,
                                           const std::stop_token& stop) const;

  /// Null when the answer is near enough to now for the feed's setting. One that is as far ahead is no better than an
  /// old one: by a clock that is wrong, an incident in force counts as one to come.
  static ErrorRef staleness(const Feed& feed, const AlertsState& state);

 private:
  /// Whether an answer was there that serves: then `alerts` is what `load` answers.
  bool takeShared(const Feed& feed, AlertsState& state, bool needsFeed, Date notBefore,
                  std::optional<AlertsFeed>& alerts) const;
  Outcome<std::optional<AlertsFeed>> fetchLocal(const Feed& feed, AlertsState& state, bool needsFeed) const;
  Outcome<std::optional<AlertsFeed>> fetchRemote(const Feed& feed, AlertsState& state, bool needsFeed,
                                                 const std::stop_token& stop) const;
  Outcome<std::optional<AlertsFeed>> lastAnswer(const Feed& feed, AlertsState& state, bool needsFeed,
                                                const ErrorRef& failure) const;

  void write(const std::filesystem::path& path, AlertsState& state, const std::string& body) const;

  FeedCache _cache;
  std::shared_ptr<CacheUsers> _users;  // null: none
};

}  // namespace nimbo
