#pragma once

#include "desktop/gtfs/static/StaticFeed.h"
#include "platform/transit/TransitArtwork.h"

namespace nimbo {

/// The line's shield: its short name, else its long name cut to what a shield holds, on its colour. Lines of subways
/// with a name of one or two characters have a circle, with a longer one a pill, as have railways and ferries; all
/// others a rounded box. A line without any name has the symbol of its mode, or null where that is unknown.
/// The accessibility text is the line's full name.
TransitArtworkRef lineArtwork(const StaticLine& line);

/// The symbol of a mode; null for an unknown one.
TransitArtworkRef modeArtwork(TransitMode mode, ArtworkUseType use);

/// "#rrggbb".
std::string colorString(std::uint32_t color);

/// The text colour on a colour: the published one when its contrast is at least 4.5 to 1, else black or white,
/// whichever contrasts more. Source: https://www.w3.org/TR/WCAG21/#contrast-minimum
std::uint32_t readableTextColor(std::uint32_t color, std::optional<std::uint32_t> published);

}  // namespace nimbo
