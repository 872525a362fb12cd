#pragma once

#include <functional>
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

/// A shield as " 12 " on its colour, or as [12]; empty for one without a text.
std::string shieldAsText(const protocol::Shield& shield, const TerminalStyle& style);

/// The rows of a snapshot, whether or not as laid out, as lines of text: title and shield on one line, the secondary
/// text below; and a row for lines that are gone from their feeds. Lines that share a short name are told apart by
/// their full names. `timeOf` gives what to say of the time of an incident by its title; null: nothing is said.
std::string rowsAsText(const protocol::Snapshot& snapshot, const TerminalStyle& style,
                       const std::function<std::string(const std::string& title)>& timeOf = nullptr);

}  // namespace nimbo
