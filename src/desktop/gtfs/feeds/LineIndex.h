#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/gtfs/static/StaticFeed.h"

namespace nimbo {

/// What a rider types to find a line.
class LineSearch {
 public:
  explicit LineSearch(std::string_view text);

 private:
  friend class LineIndex;
  std::string _key;                 // all of it
  std::vector<std::string> _words;  // in its order
};

/// The lines of a feed as searches compare them: without case and accents, in letters of any script. Immutable.
class LineIndex {
 public:
  LineIndex(const StaticFeed& feed, std::string_view feedName);

  /// How far a line, by its place in the feed, is from what is looked for: 0 for the short name, or the identifier
  /// "FEED:ROUTE_ID", itself, more the less of it a line is known by. Absent for a line that has not all words, in
  /// whatever order, in its names, its route identifier and its agency.
  std::optional<unsigned> distance(const LineSearch& search, std::size_t line) const;

  /// A line whose identifiers are longer than this many bytes is never found.
  static constexpr std::size_t kLongestIdentifiers = 64 << 10;

 private:
  struct Line {
    std::uint32_t begin = 0;                           // of its short name
    std::uint32_t longName = 0, routeID = 0, end = 0;  // where these begin
    std::uint32_t agency = 0;
    bool isFindable = true;
  };

  std::string _feedKey;  // with the colon
  std::string _keys;     // of all lines
  std::vector<Line> _lines;
  std::vector<std::string> _agencies;
};

}  // namespace nimbo
