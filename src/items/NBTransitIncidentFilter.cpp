#include "items/NBTransitIncidentFilter.h"

#include "platform/Clock.h"

namespace nimbo {

bool NBTransitIncidentFilter::shouldDisplayIncident(const TransitIncident& incident) const {
  const std::optional<Date> start = incident.startDate();
  if (start && intervalFromNow(*start) > 0) return false;
  const std::optional<Date> end = incident.endDate();
  return !end || intervalFromNow(*end) >= 0;
}

}  // namespace nimbo
