#pragma once

#include "handoff/NBUserActivityData.h"
#include "platform/transit/TransitLineItem.h"

namespace nimbo {

/// Opens the map application at this line, with its incidents. Null when the payload cannot be compressed.
NBUserActivityDataRef activityDataForLineItem(const TransitLineItemRef& lineItem);

/// Opens the map application at the list of these incidents, in this order. Null when they cannot be archived.
NBUserActivityDataRef activityDataForIncidents(const TransitIncidents& incidents);

}  // namespace nimbo
