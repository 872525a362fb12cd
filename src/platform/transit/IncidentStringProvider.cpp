#include "platform/transit/IncidentStringProvider.h"

namespace nimbo {

namespace {

/// The first text that is not empty; an empty one when there is none.
const std::string& firstText(std::initializer_list<const std::optional<std::string>*> texts) {
  static const std::string none;
  for (const auto* text : texts)
    if (*text && !(*text)->empty()) return **text;
  return none;
}

const std::string& titleOf(const TransitIncident& incident) {
  return firstText({&incident.title(), &incident.summary()});
}

}  // namespace

std::string IncidentStringProvider::cellTitleForIncident(const TransitIncident* incident) {
  return incident ? titleOf(*incident) : std::string();
}

std::string IncidentStringProvider::cellSecondaryTextForIncident(const TransitIncident* incident) {
  if (!incident) return {};
  const std::string& text = firstText({&incident->summary(), &incident->fullDescription()});
  return text == titleOf(*incident) ? std::string() : text;
}

}  // namespace nimbo
