#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace nimbo {

/// `text` with every control character (escape sequences of a hostile feed among them) replaced by a blank, line ends
/// kept. Bad UTF-8 becomes U+FFFD.
std::string printableText(std::string_view text);

/// Columns that a text takes in a terminal: wide characters two, combining marks and escape sequences none.
int terminalWidth(std::string_view text);

/// The text's lines, folded at blanks to `columns`; a word that is wider is cut. An empty text has no line.
std::vector<std::string> foldedText(std::string_view text, int columns);

}  // namespace nimbo
