#pragma once

#include "desktop/gtfs/SkipReport.h"
#include "desktop/gtfs/StaticFeedBuilder.h"
#include "desktop/gtfs/StaticFeedFiles.h"
#include "desktop/gtfs/TripRoutes.h"

namespace nimbo {

/// A static feed as read from its files.
struct ParsedStaticFeed {
  StaticFeedBuilder feed;
  TripRoutes trips;    ///< empty where the feed has no trips.txt
  SkipReport skipped;  ///< rows, by reason
};

/// Reads agency.txt, routes.txt, feed_info.txt and trips.txt, of which only routes.txt has to be there. Rows that
/// cannot be used are skipped and counted. An error when no line is left. `feedName` as in StaticFeedBuilder.
/// Source: https://gtfs.org/documentation/schedule/reference/
Outcome<ParsedStaticFeed> readStaticFeed(StaticFeedFiles& files, const std::string& feedName);

}  // namespace nimbo
