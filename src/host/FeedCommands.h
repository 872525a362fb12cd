#pragma once

#include <string>
#include <vector>

#include "host/Command.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

struct FeedOptions {
  std::string name;
  std::string staticFeed;  ///< folder, zip file or http(s) address
  std::string alerts;      ///< file or http(s) address
};

int runFeedAdd(const CommandContext& context, const FeedOptions& options);
int runFeedRemove(const CommandContext& context, const std::string& name);
int runFeedList(const CommandContext& context);
/// Reads a feed, or with an empty name every one, and prints what it holds. Fails when one cannot be read.
int runFeedCheck(const CommandContext& context, const std::string& name);

/// Prints the lines of all feeds that contain `text`, one a line, as FEED:ROUTE_ID, names and agency.
int runLines(const CommandContext& context, const std::string& text);

/// Prints a line each.
void printLines(const std::vector<TransitLineRef>& lines);

}  // namespace nimbo
