#pragma once

#include <string_view>

namespace nimbo {

/// Shared setting, a boolean for internal testing: favourite lines without incidents may show made-up ones.
inline constexpr std::string_view kNimboTransitWidgetDebugInjectFakeIncidents =
    "Nimbo.TransitWidget.internal.injectFakeIncidents";

/// Shared setting, a boolean: such a line shows none, one or two of them instead of one.
inline constexpr std::string_view kNimboTransitWidgetDebugRandomNumberIncidents =
    "Nimbo.TransitWidget.internal.randomNumberIncidents";

}  // namespace nimbo
