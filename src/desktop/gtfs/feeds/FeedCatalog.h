#pragma once

#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <stop_token>
#include <string>
#include <vector>

#include "desktop/gtfs/feeds/FeedLibrary.h"
#include "desktop/gtfs/feeds/LineIndex.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// The lines that there are to choose from. What searches compare is kept from one to the next. Blocks its thread; any
/// thread.
class FeedCatalog {
 public:
  /// The library outlives this.
  explicit FeedCatalog(const FeedLibrary& library) : _library(library) {}

  /// Hears which feed is read next, how many have been read, and how many are to be.
  using Progress = std::function<void(const std::string& feed, std::size_t done, std::size_t total)>;

  /// A line of a feed.
  struct Line {
    TransitLineRef line;
    std::string longName;  ///< may be empty
  };

  struct Query {
    std::string text;                 ///< empty: every line
    std::optional<std::string> feed;  ///< absent: of all feeds
    std::size_t offset = 0;           ///< hits that are passed over
    std::size_t limit = 0;            ///< the most lines that are wanted
  };
  struct Hits {
    std::size_t total = 0;
    std::vector<Line> lines;       ///< the nearest first, then by feed and as agencies list them; from the offset on
    std::vector<ErrorRef> errors;  ///< of feeds that could not be read, each with its feed
  };
  /// The lines that the text finds (LineIndex). An error when the configuration cannot be read, or has no such feed.
  Outcome<Hits> find(const Query& query, const std::stop_token& stop = {}, const Progress& progress = {}) const;

  struct Description {
    std::optional<Line> line;  ///< absent when it is not found
    bool isGone = false;       ///< the feeds that could have it do not
  };
  struct Descriptions {
    std::vector<Description> lines;  ///< one for each identifier
    std::vector<ErrorRef> errors;    ///< of feeds that could not be read, or are not set up, once each, with its feed
  };
  /// The lines of these identifiers, also of those that their agencies have renumbered since; one that is only a number
  /// may be of any feed. An error when the configuration cannot be read.
  Outcome<Descriptions> describe(const std::vector<MapItemIdentifierRef>& identifiers, const std::stop_token& stop = {},
                                 const Progress& progress = {}) const;

  /// Lets go of what is kept for the next search.
  void forget();

 private:
  struct KeptIndex {
    std::uint64_t checksum;  // of the feed that it is of
    std::shared_ptr<const LineIndex> index;
  };
  std::shared_ptr<const LineIndex> indexOf(const std::string& name, const StaticFeed& feed) const;

  const FeedLibrary& _library;
  mutable std::mutex _lock;
  mutable std::map<std::string, KeptIndex> _indices;  // by the names of their feeds
};

}  // namespace nimbo
