#pragma once

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/gtfs/feeds/Feed.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// Name of the made-up feed that serves while no feed is set up; no other feed may have it.
inline constexpr std::string_view kSampleFeedName = "sample";

/// The feeds that the user set up, in `feeds.json`:
///
///     {"feeds": [{"name": "metro", "static": "/data/metro.zip", "alerts": "https://example.org/alerts.pb",
///                 "minorAlerts": false, "maximumAlertsAgeMinutes": 15, "combined": false}]}
///
/// The last three may be left out. Keys that are not known here are kept. Nothing is held in memory: each call reads
/// the file, and changes of several processes at once come one after the other. Any thread.
class FeedConfiguration {
 public:
  explicit FeedConfiguration(const std::filesystem::path& configFolder)
      : _folder(configFolder), _file(configFolder / "feeds.json") {}

  const std::filesystem::path& file() const { return _file; }

  /// The feeds in their order; none when there is no file.
  Outcome<std::vector<Feed>> feeds() const;
  /// The feed of this name, or an error that lists the names there are.
  Outcome<Feed> feedNamed(std::string_view name) const;

  /// Null for a feed that could be added now, by its name.
  ErrorRef checkNewName(std::string_view name) const;
  /// Adds a feed at the end. Null on success; nothing is written otherwise.
  ErrorRef add(const Feed& feed);
  /// Takes a feed out. Null on success; nothing is written otherwise.
  ErrorRef remove(std::string_view name);

  /// Null for a name that a feed can have: one to 64 bytes of letters, digits, ".", "_", "-" and characters beyond
  /// ASCII, not beginning with "." or "-". A colon would part it from the route in "FEED:ROUTE_ID".
  static ErrorRef checkName(std::string_view name);

 private:
  std::filesystem::path _folder;
  std::filesystem::path _file;
};

}  // namespace nimbo
