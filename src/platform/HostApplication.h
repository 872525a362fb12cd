#pragma once

#include <string_view>

namespace nimbo {

/// Identifier of the map application that the widget belongs to: prefix of its activities and queue labels.
inline constexpr std::string_view kHostApplicationIdentifier = "org.nimbo.Map";

/// URL scheme that the map application opens.
inline constexpr std::string_view kHostApplicationURLScheme = "nimbo";

/// Logging subsystem of the map application's suggestions, to which the memory-pressure signposts belong.
inline constexpr std::string_view kHostSuggestionsLogSubsystem = "org.nimbo.Map.suggestions";

}  // namespace nimbo
