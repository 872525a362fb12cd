#pragma once

#include "desktop/gtfs/feeds/Feed.h"
#include "platform/transit/TransitLine.h"
#include "protocol/Feeds.h"

// What the widget process knows of feeds, as hosts use it.
namespace nimbo {

/// Null for no shield.
TransitArtworkRef artworkOf(const std::optional<protocol::Shield>& shield, ArtworkUseType use = ArtworkUseType::line);

/// The line, which can become a favourite.
TransitLineRef lineOf(const protocol::FeedLine& line);

ErrorRef errorOf(const protocol::FetchError& error);

/// Asks for a line that was found before; `identifier` has a locator.
protocol::LineKey keyOf(const MapItemIdentifier& identifier);

/// Takes away, of feeds that go with the same alerts, the fault that no alert is about one of them, where some are
/// about another.
void forgiveForeignAlerts(std::vector<protocol::FeedReport>& reports);

/// Asks for a feed that need not be set up.
protocol::FeedDefinition definitionOf(const Feed& feed);

}  // namespace nimbo
