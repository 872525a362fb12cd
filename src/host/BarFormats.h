#pragma once

#include <string>
#include <string_view>

#include "host/BarContent.h"

namespace nimbo {

/// A way of writing what a bar shows. docs/status-bars.md describes each.
struct BarFormat {
  const char* name;
  /// One line, without its end.
  std::string (*write)(const BarContent& content);
  const char* beginning = "";  ///< before the first line
  const char* end = "";        ///< behind the last one, where it is known to be that
  bool takesClicks = false;    ///< whether its bar writes click events to the standard input
};

/// The blocks' name in i3bar's protocol, by which click events are known.
inline constexpr std::string_view kBarBlockName = "nimbo-transit";

/// "waybar", "i3bar" or "line"; null for anything else.
const BarFormat* barFormatNamed(std::string_view name);

}  // namespace nimbo
