#pragma once

#include <cstddef>
#include <string_view>

namespace nimbo {

/// Where to cut UTF-8 text at `position` (a character's beginning, or the text's end) or before it, so that nothing
/// is parted that a reader takes for one character: a letter and its marks, a flag, a family of emoji. It is
/// `position` itself where a single such cluster reaches from the beginning past it, and where ICU is missing. ICU is
/// asked only where characters beyond ASCII meet. Any thread.
std::size_t clusterBoundary(std::string_view text, std::size_t position);

}  // namespace nimbo
