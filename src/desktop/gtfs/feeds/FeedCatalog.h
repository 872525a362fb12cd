#pragma once

#include <functional>
#include <set>
#include <stop_token>
#include <string_view>
#include <vector>

#include "desktop/gtfs/feeds/FeedLibrary.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// The lines that there are to choose from. Blocks its thread.
class FeedCatalog {
 public:
  struct Lines {
    std::vector<TransitLineRef> lines;  ///< by feed, then as their agencies list them
    std::vector<ErrorRef> errors;       ///< of feeds that could not be read
  };

  /// The library outlives this.
  explicit FeedCatalog(const FeedLibrary& library) : _library(library) {}

  /// The lines in whose names, route identifier or agency `text` occurs, whatever the case of its ASCII letters; all
  /// for an empty text. An error when the configuration cannot be read.
  Outcome<Lines> linesMatching(std::string_view text, const std::stop_token& stop = {}) const;

  /// The lines of these numbers; those that no feed knows are left out. An error as above.
  Outcome<Lines> linesNumbered(const std::set<std::uint64_t>& muids, const std::stop_token& stop = {}) const;

  /// Of these lines those that their feeds do not know any more, and the errors of feeds that could not be read or are
  /// not set up. An error as above.
  struct GoneLines {
    std::vector<MapItemIdentifierRef> lines;
    std::vector<ErrorRef> errors;
  };
  Outcome<GoneLines> goneLines(const std::vector<MapItemIdentifierRef>& identifiers) const;

  /// The line that is written "FEED:ROUTE_ID", or an error that says what to do.
  Outcome<TransitLineRef> lineNamed(std::string_view name) const;

 private:
  using Filter = std::function<bool(const StaticFeed& feed, const StaticLine& line)>;
  Outcome<Lines> lines(const Filter& isWanted, const std::stop_token& stop) const;

  const FeedLibrary& _library;
};

}  // namespace nimbo
