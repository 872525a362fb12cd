#pragma once

#include <filesystem>
#include <mutex>
#include <string>
#include <string_view>

#include "desktop/gtfs/feeds/Feed.h"
#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

/// Where the cache keeps what was made from a feed. Everything there can be made again.
class FeedCache {
 public:
  explicit FeedCache(std::filesystem::path folder) : _folder(std::move(folder)) {}

  const std::filesystem::path& folder() const { return _folder; }
  std::filesystem::path staticFeed(std::string_view feed) const { return file("static", feed); }
  /// How often in a row the static feed's server was asked in vain.
  std::filesystem::path attempts(std::string_view feed) const { return file("attempts", feed); }
  std::filesystem::path trips(std::string_view feed) const { return file("trips", feed); }
  std::filesystem::path alerts(std::string_view feed) const { return file("alerts", feed); }
  // Empty files, whose time is what they tell of an alerts feed, by its address's identity.
  /// Until when its last answer need not be asked for again.
  std::filesystem::path freshUntil(std::string_view address) const { return file("fresh", address); }
  /// Before when its server is not to be asked.
  std::filesystem::path retryAt(std::string_view address) const { return file("retry", address); }

  /// Drops all that is kept of a feed.
  void remove(const Feed& feed) const;

 private:
  void removeNamed(std::string_view name) const;
  std::filesystem::path file(std::string_view kind, std::string_view feed) const;
  std::filesystem::path _folder;
};

/// The processes that go by the answers in a cache. Any thread.
class CacheUsers {
 public:
  explicit CacheUsers(std::filesystem::path folder) : _folder(std::move(folder)) {}

  /// Counts as one of them as long as this lives. Harmless when repeated.
  void join();
  /// Whether there are others; where that cannot be told, there are none.
  bool hasOthers();

 private:
  std::filesystem::path _folder;
  std::mutex _lock;
  FileDescriptor _file;  // locked for reading by each of them
};

/// Logs that something could not be kept; the program goes on without it.
void logCacheFailure(const std::string& reason);

}  // namespace nimbo
