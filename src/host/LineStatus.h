#pragma once

#include <nlohmann/json.hpp>
#include <string>

#include "host/TerminalRows.h"
#include "protocol/Lines.h"

namespace nimbo {

/// How all favorite lines run together: "none" without any, else the worst of their states, of which unknown is worse
/// than affected. "unknown" also where not all favorites are known.
const char* overallState(const protocol::Lines& lines);

/// The exit status that stands for a state of `overallState`: 0 good, 3 affected, 4 unknown, 5 none.
int exitCodeOfState(const std::string& state);

/// What `status --format json` prints; docs/formats.md has its form.
nlohmann::json statusAsJSON(const protocol::Lines& lines);

/// Each line with its state, its incidents in force and the planned ones, as lines of text.
std::string linesAsText(const protocol::Lines& lines, Date now, const TerminalStyle& style);

/// What begins within seven days, by line and day; and the lines of which that is not known.
std::string plannedAsText(const protocol::Lines& lines, const TerminalStyle& style);

/// "Updated 10:41", with the day where that is not the day of `now`; local time.
std::string updatedText(Date updated, Date now);

/// "since 10:00", "from ... until ...", local time; empty where neither is known.
std::string periodText(std::optional<Date> from, std::optional<Date> until, Date now);

}  // namespace nimbo
