#include "desktop/gtfs/EffectWords.h"

#include <nlohmann/json.hpp>

#include "desktop/gtfs/Translation.h"
#include "desktop/resources/Resources.h"

namespace nimbo {

namespace {

/// Name in the published enumeration; empty for effects without words.
std::string_view nameOf(AlertEffect effect) {
  switch (effect) {
    case AlertEffect::noService:
      return "NO_SERVICE";
    case AlertEffect::reducedService:
      return "REDUCED_SERVICE";
    case AlertEffect::significantDelays:
      return "SIGNIFICANT_DELAYS";
    case AlertEffect::detour:
      return "DETOUR";
    case AlertEffect::additionalService:
      return "ADDITIONAL_SERVICE";
    case AlertEffect::modifiedService:
      return "MODIFIED_SERVICE";
    case AlertEffect::otherEffect:
      return "OTHER_EFFECT";
    case AlertEffect::stopMoved:
      return "STOP_MOVED";
    case AlertEffect::accessibilityIssue:
      return "ACCESSIBILITY_ISSUE";
    case AlertEffect::noEffect:
    case AlertEffect::unknownEffect:
      break;
  }
  return {};
}

}  // namespace

std::string effectWords(AlertEffect effect, std::string_view language) {
  const std::string_view name = nameOf(effect);
  if (name.empty()) return {};
  static const nlohmann::json words = nlohmann::json::parse(resourceNamed("alerts/effect-words.json").value());
  std::string key = "en";
  for (const auto& [tag, ignored] : words.items())
    if (isSameLanguage(tag, language)) key = tag;
  return words.at(key).at(name).get<std::string>();
}

}  // namespace nimbo
