#pragma once

#include <span>
#include <stop_token>
#include <string_view>
#include <vector>

#include "desktop/gtfs/FeedSource.h"
#include "platform/transit/TransitLineItem.h"

namespace nimbo {

/// Looks lines up in one feed: their static data and their incidents by the alerts as they are now, texts in `language`
/// (a BCP 47 tag). Answers an item for each identifier, null for one that the feed does not know: neither by its number
/// nor by an agency, short name and mode that only one line has. Blocks its thread.
Outcome<TransitLineItems> lookUpInFeed(const FeedSource& source, std::span<const MapItemIdentifierRef> identifiers,
                                       std::string_view language, const std::stop_token& stop);

}  // namespace nimbo
