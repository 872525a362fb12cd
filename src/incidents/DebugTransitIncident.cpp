#include "incidents/DebugTransitIncident.h"

#include "platform/SystemServices.h"

namespace nimbo {

namespace {
constexpr TimeInterval kOneDay = 86400;
}

std::shared_ptr<const DebugTransitIncident> DebugTransitIncident::__debug_fakeIncidentAffectingLine(
    const TransitLineItem& line) {
  const Date now = currentDate();
  const std::string message = "Something Bad™ happened";
  auto incident = std::make_shared<DebugTransitIncident>();
  incident->setMuid(line.muid() + 1);
  incident->setTitle("Something Bad™");
  incident->setSummary(line.name().value_or("(null)") + " · Possible delays due to strike");
  incident->setFullDescription(
      "Only one train out of three is working due to national strike of public transit workers.");
  incident->setMessageForRoutePlanning(message);
  incident->setMessageForRouteStepping(message);
  incident->setMessageForNonRoutable(message);
  incident->setStartDate(dateByAdding(now, -kOneDay));
  incident->setEndDate(dateByAdding(now, kOneDay));
  incident->setIconType(1);
  incident->setCreationDate(incident->startDate());
  incident->setLastUpdated(now);
  incident->setBlockingIncident(true);
  incident->setAffectedEntities({DebugAffectedEntities::initWithMuid(line.muid())});
  return incident;
}

}  // namespace nimbo
