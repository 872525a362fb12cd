#pragma once

#include "platform/ui/Color.h"
#include "platform/ui/Environment.h"

namespace nimbo {

/// Colours by what they are for.
enum class SystemColor {
  background,    ///< behind the widget
  label,         ///< texts
  systemGrey,    ///< texts that stand back
  rowHighlight,  ///< behind a touched row
};

/// Texts have a contrast of 4.5 to 1 or more on the background and on a touched row.
Color colorOf(SystemColor color, Appearance appearance);

}  // namespace nimbo
