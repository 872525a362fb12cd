#pragma once

#include <string>
#include <string_view>

namespace nimbo {

/// Whether UTF-8 text holds letters that run from right to left, other than inside isolates (U+2068 to U+2069).
bool hasRightToLeftLetters(std::string_view text);

/// The text kept together in isolates, so that its direction is its own and what stands around keeps its order.
std::string isolated(std::string_view text);

}  // namespace nimbo
