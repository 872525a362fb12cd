#include "host/LineStatus.h"

#include <algorithm>
#include <ctime>

#include "host/TerminalText.h"
#include "protocol/Coding.h"
#include "protocol/Names.h"

namespace nimbo {

using nlohmann::json;
using protocol::LineState;

namespace {

constexpr int kIndent = 2;

std::string localText(Date date, const char* format) {
  const std::time_t seconds =
      std::chrono::system_clock::to_time_t(std::chrono::time_point_cast<std::chrono::system_clock::duration>(date));
  std::tm parts{};
  char text[64];
  if (!localtime_r(&seconds, &parts) || std::strftime(text, sizeof text, format, &parts) == 0)
    return isoTextOfDate(date);
  return text;
}

std::string dayText(Date date) { return localText(date, "%Y-%m-%d"); }

/// The time, with the day where that is another one than `now`'s.
std::string timeText(Date date, Date now) {
  return localText(date, dayText(date) == dayText(now) ? "%H:%M" : "%Y-%m-%d %H:%M");
}

std::string folded(const std::string& text, int indent, const TerminalStyle& style) {
  std::string result;
  for (const std::string& line : foldedText(text, style.columns - indent))
    result += std::string(static_cast<std::size_t>(indent), ' ') + line + "\n";
  return result;
}

std::string headingOf(const protocol::LineReport& line, const TerminalStyle& style) {
  const std::string shield = line.shield ? shieldAsText(*line.shield, style) : std::string();
  std::string name = printableText(line.name);
  // The shield says the short name.
  if (line.shield && line.shield->text)
    if (const std::string shortName = printableText(*line.shield->text) + ", "; name.starts_with(shortName))
      name.erase(0, shortName.size());
  return shield.empty() || "[" + name + "]" == shield ? name : shield + " " + name;
}

std::string stateText(const protocol::LineReport& line) {
  switch (line.state) {
    case LineState::good:
      return "good service";
    case LineState::affected:
      return counted(line.incidents.size(), "incident");
    case LineState::unknown:
      break;
  }
  return line.reason ? "not known: " + printableText(line.reason->reason) : "not known";
}

std::string incidentText(const protocol::LineIncident& incident, Date now) {
  const std::string period = periodText(incident.from, incident.until, now);
  return printableText(incident.title) + (period.empty() ? "" : " (" + period + ")");
}

}  // namespace

const char* overallState(const protocol::Lines& lines) {
  const auto has = [&](LineState state) {
    return std::any_of(lines.lines.begin(), lines.lines.end(), [&](const auto& line) { return line.state == state; });
  };
  if (lines.error || has(LineState::unknown)) return "unknown";
  if (lines.lines.empty()) return "none";
  return has(LineState::affected) ? "affected" : "good";
}

int exitCodeOfState(const std::string& state) {
  constexpr int kAffected = 3, kUnknown = 4, kNone = 5;
  return state == "good" ? 0 : state == "affected" ? kAffected : state == "none" ? kNone : kUnknown;
}

json statusAsJSON(const protocol::Lines& lines) {
  json result{{"updated", lines.updated ? json(isoTextOfDate(*lines.updated)) : json()},
              {"state", overallState(lines)},
              {"lines", json::array()}};
  for (const protocol::LineReport& line : lines.lines) {
    json written = protocol::write(line);
    for (const char* own : {"muid", "shield"}) written.erase(own);
    written["reason"] = line.reason ? json(line.reason->reason) : json();
    for (const char* list : {"incidents", "planned"})
      for (json& incident : written[list])
        for (const char* own : {"image", "imageText"}) incident.erase(own);
    result["lines"].push_back(std::move(written));
  }
  return result;
}

std::string periodText(std::optional<Date> from, std::optional<Date> until, Date now) {
  std::string text;
  if (from) text = (*from > now ? "from " : "since ") + timeText(*from, now);
  if (until) text += (text.empty() ? "until " : " until ") + timeText(*until, now);
  return text;
}

std::string updatedText(Date updated, Date now) { return "Updated " + timeText(updated, now); }

std::string linesAsText(const protocol::Lines& lines, Date now, const TerminalStyle& style) {
  std::string text;
  for (const protocol::LineReport& line : lines.lines) {
    const char* sign = line.state == LineState::good ? "✓ " : line.state == LineState::affected ? "⚠ " : "? ";
    text += folded(sign + headingOf(line, style) + ": " + stateText(line), 0, style);
    for (const auto& incident : line.incidents) text += folded(incidentText(incident, now), kIndent, style);
    for (const auto& incident : line.planned) text += folded("planned: " + incidentText(incident, now), kIndent, style);
  }
  return text.empty() ? "No favorite lines.\n" : text;
}

std::string plannedAsText(const protocol::Lines& lines, const TerminalStyle& style) {
  std::string text;
  bool isPlanned = false;
  for (const protocol::LineReport& line : lines.lines) {
    if (line.state == LineState::unknown) {
      text += folded(headingOf(line, style) + ": " + stateText(line), 0, style);
      continue;
    }
    if (line.planned.empty()) continue;
    isPlanned = true;
    text += folded(headingOf(line, style), 0, style);
    std::string day;
    for (const protocol::LineIncident& incident : line.planned) {
      if (const std::string its = dayText(*incident.from); its != day) text += folded(day = its, kIndent, style);
      std::string times = localText(*incident.from, "%H:%M");
      if (incident.until) times += " until " + timeText(*incident.until, *incident.from);
      text += folded(printableText(incident.title) + " (" + times + ")", 2 * kIndent, style);
    }
  }
  return isPlanned ? text : text + "No planned work is known within seven days.\n";
}

}  // namespace nimbo
