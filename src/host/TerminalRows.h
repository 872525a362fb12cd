#pragma once

#include <string>

#include "protocol/Snapshot.h"

namespace nimbo {

/// How a terminal shows the rows.
struct TerminalStyle {
  bool colors = false;  ///< shields in their colours, titles bold, dimmed images faint
  int columns = 80;     ///< the terminal's width; texts are folded within it

  /// What the standard output can show: colours on a terminal unless NO_COLOR is set (https://no-color.org) or TERM is
  /// "dumb"; its width, else COLUMNS, else 80.
  static TerminalStyle ofStandardOutput();
};

/// The rows of a snapshot as lines of text: title and shield on one line, the secondary text below; and a row for lines
/// that are gone from their feeds.
std::string rowsAsText(const protocol::Snapshot& snapshot, const TerminalStyle& style);

}  // namespace nimbo
