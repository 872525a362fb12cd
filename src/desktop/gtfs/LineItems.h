#pragma once

#include <memory>
#include <string>
#include <unordered_map>

#include "desktop/gtfs/StaticFeed.h"
#include "platform/transit/BasicTransitLineItem.h"

namespace nimbo {

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
