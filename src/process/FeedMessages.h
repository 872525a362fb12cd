#pragma once

#include "desktop/gtfs/feeds/FeedCatalog.h"
#include "desktop/gtfs/feeds/FeedCheck.h"
#include "platform/foundation/Outcome.h"
#include "protocol/Feeds.h"

// What is known of feeds, as the protocol has it.
namespace nimbo {

/// The first 500 characters of a name, as hand-offs have them.
std::string shortened(const std::string& name);

/// Of each name come 500 characters.
protocol::FeedLine writtenLine(const FeedCatalog::Line& line);

protocol::FeedReport writtenReport(const FeedCheckReport& report);

/// The feed of a definition, or what is wrong with that.
Outcome<Feed> feedOf(const protocol::FeedDefinition& definition);

}  // namespace nimbo
