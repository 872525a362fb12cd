#include "desktop/gtfs/feeds/FeedCatalog.h"

#include <map>

#include "desktop/gtfs/feeds/FeedLookup.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

namespace {

bool holds(std::string_view text, const std::string& part) {
  return asciiLowerCase(text).find(part) != std::string::npos;
}

}  // namespace

Outcome<FeedCatalog::Lines> FeedCatalog::lines(const Filter& isWanted, const std::stop_token& stop) const {
  const auto sources = _library.sources();
  if (!sources) return sources.error();
  Lines result;
  for (const FeedSourceRef& source : *sources) {
    const auto loaded = source->staticFeed(stop);
    if (!loaded) {
      result.errors.push_back(loaded.error());
      continue;
    }
    const StaticFeed& feed = loaded->feed;
    LineItems items(source->name(), feed);
    for (std::size_t i = 0; i < feed.lineCount(); ++i)
      if (const StaticLine line = feed.line(i); isWanted(feed, line)) result.lines.push_back(items.item(i, line.muid));
  }
  return result;
}

Outcome<FeedCatalog::Lines> FeedCatalog::linesMatching(std::string_view text, const std::stop_token& stop) const {
  const auto isWanted = [part = asciiLowerCase(text)](const StaticFeed& feed, const StaticLine& line) {
    return holds(line.shortName, part) || holds(line.longName, part) || holds(line.routeID, part) ||
           holds(feed.agency(line.agency).name, part);
  };
  return lines(isWanted, stop);
}

Outcome<FeedCatalog::Lines> FeedCatalog::linesNumbered(const std::set<std::uint64_t>& muids,
                                                       const std::stop_token& stop) const {
  return lines([&](const StaticFeed&, const StaticLine& line) { return muids.contains(line.muid); }, stop);
}

Outcome<FeedCatalog::GoneLines> FeedCatalog::goneLines(const std::vector<MapItemIdentifierRef>& identifiers) const {
  if (const auto sources = _library.sources(); !sources) return sources.error();
  std::map<std::string, std::vector<MapItemIdentifierRef>> byFeed;
  for (const MapItemIdentifierRef& identifier : identifiers)
    if (identifier->locator()) byFeed[identifier->locator()->feed].push_back(identifier);
  GoneLines gone;
  for (const auto& [name, ofFeed] : byFeed) {
    const auto source = _library.sourceNamed(name);
    const auto loaded = source ? (*source)->staticFeed({}) : source.error();
    if (!loaded) {
      gone.errors.push_back(loaded.error());
      continue;
    }
    const auto found = findLines(loaded->feed, name, ofFeed);
    for (std::size_t i = 0; i < found.size(); ++i)
      if (!found[i]) gone.lines.push_back(ofFeed[i]);
  }
  return gone;
}

Outcome<TransitLineRef> FeedCatalog::lineNamed(std::string_view name) const {
  const auto unknown = [&](const std::string& why) {
    return transitLineServiceError(
        TransitLineServiceError::unknownLine,
        "No line is named \"" + std::string(name) + "\": " + why + " \"lines\" lists the lines there are.");
  };
  const std::size_t colon = name.find(':');
  if (colon == std::string_view::npos) return unknown("write the feed, a colon and the route, FEED:ROUTE_ID.");
  const auto source = _library.sourceNamed(name.substr(0, colon));
  if (!source) return source.error();
  const auto loaded = (*source)->staticFeed({});
  if (!loaded) return loaded.error();
  const StaticFeed& feed = loaded->feed;
  for (std::size_t i = 0; i < feed.lineCount(); ++i)
    if (feed.line(i).routeID == name.substr(colon + 1))
      return TransitLineRef(LineItems((*source)->name(), feed).item(i, feed.line(i).muid));
  return unknown("its feed has no such route.");
}

}  // namespace nimbo
