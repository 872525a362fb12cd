#pragma once

#include <string>
#include <string_view>

#include "platform/transit/TransitLine.h"

namespace nimbo {

/// What a favourite keeps of a line, but for its number: where it is found, name, colour, system and shields, as JSON
/// (see docs/state-database.md).
std::string contentOfFavoriteLine(const TransitLine& line);

/// The line again, a line item without incidents. Null when `content` is not what `contentOfFavoriteLine` makes;
/// members that it does not know are passed over.
TransitLineRef favoriteLineOfContent(std::uint64_t muid, std::string_view content);

}  // namespace nimbo
