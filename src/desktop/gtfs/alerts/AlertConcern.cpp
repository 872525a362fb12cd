#include "desktop/gtfs/alerts/AlertConcern.h"

#include <algorithm>
#include <iterator>

#include "desktop/gtfs/text/PlainText.h"
#include "desktop/gtfs/text/Translation.h"

namespace nimbo {

namespace {

constexpr std::size_t kLongestDetail = 40;  // characters

struct Detail {
  std::string_view word;
  AlertConcern concern;
};
// The reference's words, and those of agencies that publish finer ones. Source of the latter:
// https://www.mbta.com/developers/v3-api, "effect" of an alert.
constexpr Detail kDetails[] = {
    {"NO_SERVICE", AlertConcern::noService},
    {"SUSPENSION", AlertConcern::noService},
    {"REDUCED_SERVICE", AlertConcern::reducedService},
    {"CANCELLATION", AlertConcern::reducedService},
    {"SHUTTLE", AlertConcern::reducedService},
    {"SIGNIFICANT_DELAYS", AlertConcern::delays},
    {"DELAY", AlertConcern::delays},
    {"DELAYS", AlertConcern::delays},
    {"DETOUR", AlertConcern::detour},
    {"SNOW_ROUTE", AlertConcern::detour},
    {"MODIFIED_SERVICE", AlertConcern::other},
    {"SERVICE_CHANGE", AlertConcern::other},
    {"SCHEDULE_CHANGE", AlertConcern::other},
    {"TRACK_CHANGE", AlertConcern::other},
    {"STATION_CLOSURE", AlertConcern::other},
    {"STATION_ISSUE", AlertConcern::other},
    {"DOCK_CLOSURE", AlertConcern::other},
    {"DOCK_ISSUE", AlertConcern::other},
    {"STOP_CLOSURE", AlertConcern::other},
    {"STOP_MOVE", AlertConcern::other},
    {"STOP_MOVED", AlertConcern::other},
    {"ADDITIONAL_SERVICE", AlertConcern::additionalService},
    {"EXTRA_SERVICE", AlertConcern::additionalService},
    {"NO_EFFECT", AlertConcern::none},
    {"ACCESSIBILITY_ISSUE", AlertConcern::none},
    {"ACCESS_ISSUE", AlertConcern::none},
    {"ELEVATOR_CLOSURE", AlertConcern::none},
    {"ESCALATOR_CLOSURE", AlertConcern::none},
    {"FACILITY_ISSUE", AlertConcern::none},
    {"BIKE_ISSUE", AlertConcern::none},
    {"PARKING_CLOSURE", AlertConcern::none},
    {"PARKING_ISSUE", AlertConcern::none},
    {"POLICY_CHANGE", AlertConcern::none},
    {"AMBER_ALERT", AlertConcern::none},
    {"SUMMARY", AlertConcern::none},
};

/// "Elevator closure" as "ELEVATOR_CLOSURE".
std::string asWord(std::string_view detail) {
  std::string word;
  for (const char c : detail)
    if (c >= 'a' && c <= 'z')
      word += static_cast<char>(c - 'a' + 'A');
    else
      word += c == ' ' || c == '-' ? '_' : c;
  return word;
}

AlertConcern concernOf(AlertEffect effect) {
  switch (effect) {
    case AlertEffect::noService:
      return AlertConcern::noService;
    case AlertEffect::reducedService:
      return AlertConcern::reducedService;
    case AlertEffect::significantDelays:
      return AlertConcern::delays;
    case AlertEffect::detour:
      return AlertConcern::detour;
    case AlertEffect::additionalService:
      return AlertConcern::additionalService;
    case AlertEffect::noEffect:
    case AlertEffect::accessibilityIssue:
      return AlertConcern::none;
    case AlertEffect::modifiedService:
    case AlertEffect::otherEffect:
    case AlertEffect::unknownEffect:
    case AlertEffect::stopMoved:
      break;
  }
  return AlertConcern::other;
}

}  // namespace

AlertConcern concernOf(AlertEffect effect, std::string_view detail) {
  const std::string word = asWord(detail);
  const auto* const known =
      std::find_if(std::begin(kDetails), std::end(kDetails), [&](const Detail& listed) { return listed.word == word; });
  if (known != std::end(kDetails)) return known->concern;
  // Of escalators, car parks and fares.
  const bool saysNothing = effect == AlertEffect::otherEffect || effect == AlertEffect::unknownEffect;
  if (word == "INFORMATIONAL" && saysNothing) return AlertConcern::none;
  return concernOf(effect);
}

std::string effectDetailIn(std::string_view alert) {
  const auto translations = translationsIn(alert, AlertField::effectDetail);
  return plainText(chooseTranslation(translations, {.user = "en", .feed = {}}), kLongestDetail);
}

}  // namespace nimbo
