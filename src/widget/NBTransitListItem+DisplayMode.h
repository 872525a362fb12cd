#pragma once

#include "items/NBTransitListItem.h"
#include "platform/ui/WidgetHost.h"

namespace nimbo {

/// The largest mode that the rows have a use for: Expanded when there are expanded rows.
WidgetDisplayMode widgetLargestAvailableDisplayMode(const NBTransitListItem& listItem);

}  // namespace nimbo
