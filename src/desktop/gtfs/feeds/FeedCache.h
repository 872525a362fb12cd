#pragma once

#include <filesystem>
#include <string>
#include <string_view>

#include "desktop/gtfs/feeds/Feed.h"

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

  /// Drops all that is kept of a feed.
  void remove(const Feed& feed) const;

 private:
  void removeNamed(std::string_view name) const;
  std::filesystem::path file(std::string_view kind, std::string_view feed) const;
  std::filesystem::path _folder;
};

/// Logs that something could not be kept; the program goes on without it.
void logCacheFailure(const std::string& reason);

}  // namespace nimbo
