#include "platform/transit/IncidentStringProvider.h"

namespace nimbo {

namespace {

/// The first text that is not empty; empty when there is none.
std::string firstText(std::initializer_list<const std::optional<std::string>*> texts) {
  for (const auto* text : texts)
    if (*text && !(*text)->empty()) return **text;
  return {};
}

}  // namespace

std::string IncidentStringProvider::cellTitleForIncident(const TransitIncident* incident) {
  return incident ? firstText({&incident->title(), &incident->summary()}) : std::string();
}

std::string IncidentStringProvider::cellSecondaryTextForIncident(const TransitIncident* incident) {
  if (!incident) return {};
  std::string text = firstText({&incident->summary(), &incident->fullDescription()});
  return text == cellTitleForIncident(incident) ? std::string() : text;
}

}  // namespace nimbo
