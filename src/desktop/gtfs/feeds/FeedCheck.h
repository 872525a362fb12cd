#pragma once

#include <functional>
#include <optional>
#include <stop_token>
#include <string>
#include <vector>

#include "desktop/gtfs/feeds/Feed.h"
#include "desktop/gtfs/feeds/FeedCache.h"
#include "desktop/gtfs/feeds/SkipReport.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// What a static feed holds.
struct CheckedStaticFeed {
  std::size_t agencies = 0;
  std::size_t lines = 0;
  std::size_t trips = 0;
  std::string language;  ///< empty where the feed does not say
  SkipReport skipped;    ///< rows
};

/// What an alerts feed holds, and how it fits the static one.
struct CheckedAlerts {
  std::string version;
  std::optional<Date> timestamp;
  ErrorRef staleness;  ///< not null when the feed is too old to be used
  std::size_t alerts = 0;
  SkipReport skipped;      ///< entities and alerts that make no incident
  bool hasOthers = false;  ///< positions of vehicles or times of trips come beside the alerts
  // Against the static feed; 0 and empty where that cannot be read.
  std::size_t periods = 0;  ///< of alerts that concern a line
  std::size_t selectors = 0;
  std::size_t incidents = 0;      ///< different ones, in force or to come
  std::size_t affectedLines = 0;  ///< with an incident in force now
  SkipReport unfit;               ///< selectors that fit no line: how a false "good service" comes about
  ErrorRef gap;                   ///< not null when no verdict on a line can be had from the alerts
};

/// What a feed holds and how well its two halves fit together.
struct FeedCheckReport {
  using Static = CheckedStaticFeed;
  using Alerts = CheckedAlerts;

  std::string name;
  std::optional<Static> staticFeed;
  ErrorRef staticError;  ///< not null when the static feed cannot be read
  std::optional<Alerts> alerts;
  ErrorRef alertsError;  ///< not null when the alerts cannot be read

  /// What keeps lines from a verdict; empty for a feed that can be used.
  std::vector<ErrorRef> faults() const;
  /// Whether the alerts are another kind of feed, which may hold some at other times.
  bool isOtherFeed() const;
};

/// Hears when a half of a feed is begun with, and of the static one's bytes as they come. Called on the thread that
/// checks.
struct FeedCheckProgress {
  std::function<void()> beginsAlerts;
  std::function<void(std::uint64_t received, std::optional<std::uint64_t> length)> receives;
};

/// Reads both halves of a feed from their sources, whatever the cache holds, and checks them. Blocks its thread.
FeedCheckReport checkFeed(const Feed& feed, const FeedCache& cache, const std::stop_token& stop = {},
                          const FeedCheckProgress& progress = {});

}  // namespace nimbo
