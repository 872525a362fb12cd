#pragma once

#include "platform/foundation/Log.h"

namespace nimbo {

/// Where the widget's own log lines belong.
inline constexpr LogFacility NBTransitWidgetLogFacility{kDefaultLogSubsystem, "TransitWidget"};

}  // namespace nimbo
