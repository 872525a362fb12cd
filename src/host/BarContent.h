#pragma once

#include <optional>
#include <string>
#include <vector>

#include "protocol/Lines.h"
#include "protocol/Snapshot.h"

namespace nimbo {

/// What a status bar shows of the widget, in no bar's form: texts are as feeds and tables have them, and the formats
/// make them harmless (`BarFormats.h`).
struct BarContent {
  /// A line of what comes up beside the bar.
  struct Detail {
    enum class Style { title, text, remark };
    Style style = Style::text;
    std::string text;
  };

  /// The compact row's title, at most 80 columns, with what has to be told beside it: "● " before what is new, "(old)"
  /// behind what is stale, and lines that are gone.
  std::string text;
  std::string sign;  ///< for a bar without room: "✓", "⚠", "?" or "–"
  /// "good", "advisories", "none" (no favorite lines), "error", "old" (rows of an earlier session, until the first
  /// answer) or "gone" (the feeds do not know some lines any more, and the others run well).
  std::string state;
  bool hasGoneLines = false;
  bool isNew = false;             ///< an incident in force was not seen yet
  bool isStale = false;           ///< rows of an earlier session, or older than 15 minutes
  std::optional<int> percentage;  ///< of the lines that run well, rounded down; absent where one is unknown
  std::vector<Detail> details;
};

/// Seconds after which rows are stale.
inline constexpr TimeInterval kBarStaleAfter = 15 * 60;

/// What to show of a snapshot and the lines of the same moment. Absent while the widget has nothing to show: before its
/// first fetch, without rows of the last time.
std::optional<BarContent> barContentOf(const protocol::Snapshot& snapshot, const protocol::Lines& lines, Date now);

/// What to show of a widget that cannot be shown; `reason` is what went wrong and what to do.
BarContent barContentOfFailure(const std::string& reason);

}  // namespace nimbo
