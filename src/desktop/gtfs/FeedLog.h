#pragma once

#include "platform/foundation/Log.h"

namespace nimbo {

/// Where the line service and its feeds log.
inline constexpr LogFacility kFeedLogFacility{kDefaultLogSubsystem, "TransitLineService"};

}  // namespace nimbo
