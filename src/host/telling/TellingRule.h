#pragma once

#include <string>
#include <vector>

#include "desktop/store/ToldIncidents.h"
#include "host/notices/Notice.h"
#include "host/telling/NoticeTexts.h"
#include "protocol/Lines.h"

namespace nimbo {

/// What the desktop is to do.
struct Telling {
  std::vector<Notice> notices;      ///< to post; the silent ones change what stands
  std::vector<std::string> closed;  ///< keys of notices to take away
};

/// What restricts the telling at a moment.
struct TellingLimits {
  bool onlySevere = false;
  bool isQuiet = false;  ///< nothing may disturb; what begins or worsens meanwhile waits, what ends is taken away
};

/// Decides what an answer to "lines" has to tell, given what was told before, and notes it in `state`. Incidents that
/// count (not those without concern, of additional service, or for information) are told when they begin, get worse and
/// end, those of one answer in one notice; their notices follow their texts in silence. Once each: whatever the number
/// of lines, under another number with the same texts on a common line, and in a period that begins within a day after
/// the last one. What runs already on a line that is new in `state`, and what the user has seen, counts as told. An
/// unknown state ends nothing, and an answer older than the one before it, or of the made-up city, decides nothing.
Telling tellChanges(ToldState& state, const protocol::Lines& lines, Date now, TellingLimits limits,
                    const NoticeTexts& texts);

/// Has what these notices told be told again.
void forgetTold(ToldState& state, const std::vector<std::string>& keys);

}  // namespace nimbo
