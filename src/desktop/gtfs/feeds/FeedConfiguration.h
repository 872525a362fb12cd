#pragma once

#include <filesystem>
#include <functional>
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
///                 "staticMirror": "https://example.net/metro.zip", "minorAlerts": false,
///                 "maximumAlertsAgeMinutes": 15, "combined": false}]}
///
/// The last four may be left out. The keys of servers stand apart, in `keys.json`, which is for the user's eyes alone:
///
///     {"keys": {"metro": {"alerts": {"headers": ["apikey: …"], "query": "token=…"}, "static": {"headers": […]}}}}
///
/// What is not known here is kept. Nothing is held in memory: each call reads the files, and changes of several
/// processes at once come one after the other. Any thread.
class FeedConfiguration {
 public:
  explicit FeedConfiguration(const std::filesystem::path& configFolder)
      : _folder(configFolder), _file(configFolder / "feeds.json"), _keysFile(configFolder / "keys.json") {}

  const std::filesystem::path& file() const { return _file; }

  /// The feeds in their order; none when there is no file.
  Outcome<std::vector<Feed>> feeds() const;
  /// The feed of this name, or an error that lists the names there are.
  Outcome<Feed> feedNamed(std::string_view name) const;

  /// Null for a feed that could be added now, by its name.
  ErrorRef checkNewName(std::string_view name) const;
  /// Adds a feed at the end. Null on success; nothing is written otherwise.
  ErrorRef add(const Feed& feed);
  /// Puts a feed in the place of the one of its name. Null on success; nothing is written otherwise.
  ErrorRef replace(const Feed& feed);
  /// Takes a feed out. Null on success; nothing is written otherwise.
  ErrorRef remove(std::string_view name);

  /// Null for a name that a feed can have: one to 64 bytes of letters, digits, ".", "_", "-" and characters beyond
  /// ASCII, not beginning with "." or "-". A colon would part it from the route in "FEED:ROUTE_ID".
  static ErrorRef checkName(std::string_view name);

 private:
  struct Documents;
  Outcome<Documents> read() const;
  /// Null on success; nothing is written otherwise.
  ErrorRef change(const std::function<ErrorRef(Documents& documents)>& what);

  std::filesystem::path _folder;
  std::filesystem::path _file;
  std::filesystem::path _keysFile;
};

}  // namespace nimbo
