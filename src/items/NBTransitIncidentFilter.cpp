#include "items/NBTransitIncidentFilter.h"

#include "platform/SystemServices.h"

namespace nimbo {

bool NBTransitIncidentFilter::shouldDisplayIncident(const TransitIncident& incident) const {
  const Date now = currentDate();
  const std::optional<Date> start = incident.startDate(), end = incident.endDate();
  return (!start || *start <= now) && (!end || *end >= now);
}

}  // namespace nimbo
