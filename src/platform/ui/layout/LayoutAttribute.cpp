#include "platform/ui/layout/LayoutAttribute.h"

#include <array>
#include <cstddef>

namespace nimbo {

LayoutAttributeKind kindOfLayoutAttribute(LayoutAttribute attribute) {
  switch (attribute) {
    case LayoutAttribute::leading:
    case LayoutAttribute::trailing:
      return LayoutAttributeKind::horizontalPosition;
    case LayoutAttribute::width:
    case LayoutAttribute::height:
      return LayoutAttributeKind::length;
    default:
      return LayoutAttributeKind::verticalPosition;
  }
}

std::string_view nameOfLayoutAttribute(LayoutAttribute attribute) {
  static constexpr std::array<std::string_view, 9> kNames = {
      "leading", "trailing", "top", "bottom", "centerY", "width", "height", "firstBaseline", "lastBaseline"};
  return kNames.at(static_cast<std::size_t>(attribute));
}

}  // namespace nimbo
