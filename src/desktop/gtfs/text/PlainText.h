#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace nimbo {

/// A publisher's text as plain UTF-8 to be shown as it is, whatever he put into it: HTML (tags left open or cut off
/// too) loses its tags, its blocks and breaks become line ends, character references are decoded once, white space is
/// folded to single spaces, line ends to at most one empty line. Controls, invisible characters and explicit
/// directional embeddings go; the direction marks stay in texts that hold right-to-left letters. Joiners stay between
/// letters beyond ASCII. A text of more than `limit` characters (at least 1) is cut there, between what a reader takes
/// for characters, and ends in an ellipsis. Linear in the text's length.
std::string plainText(std::string_view text, std::size_t limit = std::string::npos);

}  // namespace nimbo
