#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace nimbo {

/// What to tell the user of a favourite line, "FEED:ROUTE_ID", that its feed does not know any more.
inline std::string goneLineText(const std::string& line) {
  return "the favorite line " + line +
         " is gone from its feed, and its incidents with it. Find it anew with \"lines\", or forget it with \"favorite "
         "remove " +
         line + "\".";
}

/// The same in few words, for a row of its own; empty where no line is gone.
inline std::string goneLinesTitle(const std::vector<std::string>& lines) {
  return lines.empty()       ? std::string()
         : lines.size() == 1 ? "1 line gone"
                             : std::to_string(lines.size()) + " lines gone";
}

/// `text` for a terminal: every control character (escape sequences of a hostile feed among them) is a blank, line ends
/// stay, and characters that set a direction go: few terminals know them, and they turn what stands around. Bad UTF-8
/// becomes U+FFFD.
std::string printableText(std::string_view text);

/// `text` as Pango markup: as above, but isolates and marks stay, which Pango knows.
std::string markupText(std::string_view text);

/// JSON of the same meaning for a terminal: such characters are escaped in it.
std::string printableJSON(std::string_view json);

/// "1 alert", "2 alerts"; the plural is given where it is not made with an s.
std::string counted(std::size_t count, const std::string& noun, const std::string& plural = {});

/// Prints a message of nimbo-transit on standard error, after what standard output was given before.
void printMessage(const std::string& message);

/// Columns that a text takes in a terminal: wide characters two, combining marks and escape sequences none.
int terminalWidth(std::string_view text);

/// Prints rows of texts that are printable, each with as many, in columns. An empty column takes no room.
void printTable(const std::vector<std::vector<std::string>>& rows);

/// `text` in one line of valid UTF-8, at most so many columns wide, with an ellipsis in the last one where it was cut.
std::string shortenedText(std::string_view text, int columns);

/// The text's lines, folded at blanks to `columns`; a word that is wider is cut. An empty text has no line.
std::vector<std::string> foldedText(std::string_view text, int columns);

}  // namespace nimbo
