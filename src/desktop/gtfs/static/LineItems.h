#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>

#include "desktop/gtfs/static/StaticFeed.h"
#include "platform/transit/BasicTransitLineItem.h"
#include "platform/transit/MapItemIdentifier.h"

namespace nimbo {

/// The short name, else the long one; empty for a line without names.
inline std::string_view nameOfLine(const StaticLine& line) {
  return line.shortName.empty() ? line.longName : line.shortName;
}

/// Short and long name, as they are read out: "7, Airport Express"; one where there is only one.
inline std::string fullNameOfLine(const StaticLine& line) {
  std::string name(nameOfLine(line));
  if (!line.shortName.empty() && !line.longName.empty() && line.longName != line.shortName)
    name.append(", ").append(line.longName);
  return name;
}

/// A line as its user writes it, "FEED:ROUTE_ID"; its number where only that is known.
inline std::string writtenNameOfLine(const MapItemIdentifier& identifier) {
  const auto& locator = identifier.locator();
  return locator ? locator->feed + ":" + locator->routeID : std::to_string(identifier.muid());
}

/// Makes line items of a static feed's lines. Lines of one agency share one system, whose symbol is that of the mode
/// that all its lines share.
class LineItems {
 public:
  /// `feedName` as the user set the feed up.
  LineItems(std::string feedName, StaticFeed feed) : _feedName(std::move(feedName)), _feed(std::move(feed)) {}

  /// Where the line of this index is found.
  TransitLineLocator locatorOf(std::size_t line) const;
  /// The line of this index, with incidents where there are any. `muid` is the number under which it was asked for,
  /// its own one or that of a favourite that its agency has renumbered since.
  TransitLineItemRef item(std::size_t line, std::uint64_t muid, TransitIncidents incidents = {});

 private:
  TransitSystemRef system(std::size_t agency);

  std::string _feedName;
  StaticFeed _feed;
  std::unordered_map<std::size_t, TransitSystemRef> _systems;
};

}  // namespace nimbo
