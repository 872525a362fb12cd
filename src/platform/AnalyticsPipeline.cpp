#include "platform/AnalyticsPipeline.h"

#include <algorithm>

namespace nimbo {

void TransitWidgetAnalyticsRecord::addTransitIncidentItem(TransitIncidentAnalyticsItem item) {
  const auto isSame = [&](const TransitIncidentAnalyticsItem& other) {
    return other.transitLineMuid == item.transitLineMuid && other.transitIncidentTitle == item.transitIncidentTitle;
  };
  const auto begin = incidentItems.begin(), end = incidentItems.end();
  auto found = std::find_if(begin + static_cast<std::ptrdiff_t>(next), end, isSame);
  if (found == end) found = std::find_if(begin, end, isSame);
  if (found == end)
    found = incidentItems.insert(end, std::move(item));
  else
    found->count += item.count;
  next = static_cast<std::size_t>(found - incidentItems.begin()) + 1;
}

}  // namespace nimbo
