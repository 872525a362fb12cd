#include "host/telling/IncidentWords.h"

#include <string_view>

#include "platform/Localization.h"

namespace nimbo {

namespace {

struct WordKey {
  std::string_view word;
  const char* key;  // of its text
};
constexpr WordKey kEffects[] = {
    {"no_service", "Window_Effect_no_service"},
    {"reduced_service", "Window_Effect_reduced_service"},
    {"significant_delays", "Window_Effect_significant_delays"},
    {"detour", "Window_Effect_detour"},
    {"additional_service", "Window_Effect_additional_service"},
    {"modified_service", "Window_Effect_modified_service"},
    {"stop_moved", "Window_Effect_stop_moved"},
    {"no_effect", "Window_Effect_no_effect"},
    {"accessibility_issue", "Window_Effect_accessibility_issue"},
};
constexpr WordKey kCauses[] = {
    {"technical_problem", "Window_Cause_technical_problem"},
    {"strike", "Window_Cause_strike"},
    {"demonstration", "Window_Cause_demonstration"},
    {"accident", "Window_Cause_accident"},
    {"holiday", "Window_Cause_holiday"},
    {"weather", "Window_Cause_weather"},
    {"maintenance", "Window_Cause_maintenance"},
    {"construction", "Window_Cause_construction"},
    {"police_activity", "Window_Cause_police_activity"},
    {"medical_emergency", "Window_Cause_medical_emergency"},
    {"special_event", "Window_Cause_special_event"},
};

template <std::size_t Count>
std::string textOfWord(const WordKey (&words)[Count], const std::string& word) {
  for (const WordKey& known : words)
    if (known.word == word) return LocalizedString(known.key);
  return {};
}

std::string textOfSeverity(protocol::Severity severity) {
  static constexpr const char* kKeys[] = {"", "Window_Severity_info", "Window_Severity_warning",
                                          "Window_Severity_severe"};
  return severity == protocol::Severity::unknown ? "" : LocalizedString(kKeys[static_cast<std::size_t>(severity)]);
}

}  // namespace

std::string marksOf(const protocol::LineIncident& incident) {
  std::string text;
  for (const std::string& words :
       {textOfSeverity(incident.severity), textOfWord(kEffects, incident.effect), textOfWord(kCauses, incident.cause)})
    if (!words.empty()) text += (text.empty() ? "" : " · ") + words;
  return text;
}

}  // namespace nimbo
