#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace nimbo::protocol {

/// A symbol: the fields of a TransitIcon.
struct Icon {
  std::int64_t iconType = 0;
  std::int64_t cartoID = 0;
  std::int64_t defaultTransitType = 0;
  std::int64_t iconAttributeKey = 0;
  std::int64_t iconAttributeValue = 0;
};

/// A line's shield, or the symbol of a system, described and not drawn.
struct Shield {
  std::optional<std::string> text;
  std::optional<std::string> color;      ///< "#rrggbb"
  std::optional<std::string> textColor;  ///< "#rrggbb"; absent: black or white
  std::int64_t type = 0;                 ///< a ShieldType
  std::optional<Icon> icon;
  std::optional<std::string> accessibilityText;  ///< the line's full name
};

}  // namespace nimbo::protocol
