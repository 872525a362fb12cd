#include "host/telling/NoticeTexts.h"

#include <algorithm>

#include "desktop/gtfs/text/Utf8.h"
#include "host/telling/IncidentWords.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

// What fits on a screen: lines of an incident, incidents of a notice, characters of a title and of a text.
constexpr std::size_t kMostLines = 3, kMostIncidents = 5, kLongestTitle = 120, kLongestText = 400, kLongestName = 60;

std::string cut(const std::string& text, std::size_t characters) {
  const std::string_view first = firstCharacters(text, characters);
  return first.size() == text.size() ? text : std::string(first) + "…";
}

std::string shortNameOf(const protocol::LineReport& line) {
  const std::string text = line.shield ? line.shield->text.value_or("") : std::string();
  return cut(text.empty() ? line.name : text, kLongestName);
}

std::string namesOf(const std::vector<const protocol::LineReport*>& lines) {
  if (lines.size() == 1) return cut(lines.front()->name, kLongestName);
  std::vector<std::string> names;
  for (std::size_t i = 0; i < std::min(lines.size(), kMostLines); ++i) names.push_back(shortNameOf(*lines[i]));
  if (lines.size() > kMostLines)
    names.push_back(LocalizedFormat(LocalizedString("Transit_Incident_Not_Displayed_Incidents"),
                                    {std::uint64_t{lines.size() - kMostLines}}));
  return CommaDelimitedList(names);
}

/// "1, Harbour Line: Signal failure".
std::string headingOf(const IncidentOnLines& told) {
  const std::string title = cut(told.title, kLongestTitle);
  if (told.lines.empty()) return title;
  return LocalizedFormat(LocalizedString("TransitWidget_Single_Line_Prepended_Incident_Text"),
                         {namesOf(told.lines), title});
}

void addLine(std::string& text, const std::string& line) {
  if (!line.empty()) text += (text.empty() ? "" : "\n") + line;
}

Notice::Urgency urgencyOf(const IncidentOnLines& told) {
  if (!told.incident) return Notice::Urgency::normal;
  switch (told.incident->severity) {
    case protocol::Severity::severe:
      return Notice::Urgency::critical;
    case protocol::Severity::info:
      return Notice::Urgency::low;
    case protocol::Severity::unknown:
    case protocol::Severity::warning:
      break;
  }
  return Notice::Urgency::normal;
}

/// The first ones, each with its lines, and how many there are beside them.
std::string listOf(const std::vector<IncidentOnLines>& incidents) {
  std::string text;
  const std::size_t shown = std::min(incidents.size(), kMostIncidents);
  for (std::size_t i = 0; i < shown; ++i) addLine(text, headingOf(incidents[i]));
  if (shown < incidents.size())
    addLine(text, LocalizedFormat(LocalizedString("TransitWidget_advisory_overflow_title"),
                                  {std::uint64_t{incidents.size() - shown}}));
  return text;
}

}  // namespace

Notice NoticeTexts::noticeOf(const IncidentOnLines& told, bool isWorse, Date now) const {
  const protocol::LineIncident& incident = *told.incident;
  Notice notice{.title = headingOf(told), .urgency = urgencyOf(told), .opens = "nimbo://incident?id=" + incident.id};
  if (isWorse) addLine(notice.body, LocalizedString("Notice_Worse"));
  addLine(notice.body, marksOf(incident));
  addLine(notice.body, _dates.textOfPeriod(incident.from, incident.until, now));
  addLine(notice.body, cut(incident.text.value_or(""), kLongestText));
  return notice;
}

Notice NoticeTexts::noticeOfAll(const std::vector<IncidentOnLines>& told) const {
  Notice notice{
      .title = LocalizedFormat(LocalizedString("TransitWidget_Summary_advisory_count"), {std::uint64_t{told.size()}}),
      .body = listOf(told),
      .urgency = Notice::Urgency::low,
      .opens = "nimbo://"};
  for (const IncidentOnLines& one : told) notice.urgency = std::max(notice.urgency, urgencyOf(one));
  return notice;
}

Notice NoticeTexts::noticeOfEnded(const std::vector<IncidentOnLines>& ended) const {
  return {.title = LocalizedFormat(LocalizedString("Notice_Ended"), {std::uint64_t{ended.size()}}),
          .body = listOf(ended),
          .urgency = Notice::Urgency::low,
          .opens = "nimbo://"};
}

}  // namespace nimbo
