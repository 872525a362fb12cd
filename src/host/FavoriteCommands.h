#pragma once

#include <string>
#include <vector>

#include "host/Command.h"

namespace nimbo {

// Lines are named FEED:ROUTE_ID.

int runFavoriteAdd(const CommandContext& context, const std::vector<std::string>& lines);
int runFavoriteRemove(const CommandContext& context, const std::vector<std::string>& lines);
/// `position` counts from 1.
int runFavoriteMove(const CommandContext& context, const std::string& line, int position);
int runFavoriteList(const CommandContext& context);

}  // namespace nimbo
