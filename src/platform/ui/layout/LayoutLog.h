#pragma once

#include "platform/foundation/Log.h"

namespace nimbo {

/// Where views and constraints report what they could not lay out.
inline constexpr LogFacility kLayoutLogFacility{kDefaultLogSubsystem, "Layout"};

}  // namespace nimbo
