#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "desktop/gtfs/feeds/SkipReport.h"
#include "desktop/gtfs/static/StaticFeed.h"
#include "desktop/gtfs/static/StaticFeedFiles.h"
#include "desktop/gtfs/static/TripRoutes.h"

namespace nimbo {

/// Gathers agencies and lines into a StaticFeed. Texts become valid UTF-8, identifiers as `Identifier` says.
class StaticFeedBuilder {
 public:
  /// `feed` is the name under which the user set the feed up: the numbers of lines are made from it.
  explicit StaticFeedBuilder(std::string feed) : _feed(std::move(feed)) {}

  void setLanguage(std::string_view tag) { _language = tag; }

  /// False, and nothing added, when there is an agency of this identifier.
  bool addAgency(std::string_view publishedID, std::string_view name);
  /// False, and nothing added, when there is a line of this route. An agency that was not added is added without a
  /// name; an empty one means the only agency there is.
  bool addLine(std::string_view publishedAgencyID, const StaticLine& line);
  /// The index of a route's line.
  std::optional<std::uint32_t> lineOfRoute(std::string_view routeID) const;
  std::size_t lineCount() const { return _lines.size(); }
  std::size_t agencyCount() const { return _agencies.size(); }

  StaticFeed finish(std::string_view fingerprint, Date checkedAt) const;

 private:
  FlatText add(std::string_view text);

  std::string _feed;
  std::string _language;
  std::string _texts;
  std::vector<FlatAgency> _agencies;
  std::vector<FlatLine> _lines;
  std::unordered_map<std::string, std::uint32_t> _agencyByID, _lineByRoute;
};

/// A static feed as read from its files.
struct ParsedStaticFeed {
  StaticFeedBuilder feed;
  TripRoutes trips;    ///< not whole where the feed has no trips.txt, or it cannot be read to its end
  SkipReport skipped;  ///< rows, by reason
};

/// Reads agency.txt, routes.txt, feed_info.txt and trips.txt, of which only routes.txt has to be there. Rows that
/// cannot be used are skipped and counted. An error when no line is left. `feedName` as in StaticFeedBuilder.
/// Source: https://gtfs.org/documentation/schedule/reference/
Outcome<ParsedStaticFeed> readStaticFeed(StaticFeedFiles& files, const std::string& feedName);

}  // namespace nimbo
