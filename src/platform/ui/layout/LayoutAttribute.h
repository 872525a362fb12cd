#pragma once

#include <string_view>

namespace nimbo {

/// What of an item a constraint is about. Leading is left where texts run from left to right, and right elsewhere.
enum class LayoutAttribute {
  leading,
  trailing,
  top,
  bottom,
  centerY,
  width,
  height,
  firstBaseline,
  lastBaseline,
};

/// Attributes of different kinds cannot be compared.
enum class LayoutAttributeKind { horizontalPosition, verticalPosition, length };

LayoutAttributeKind kindOfLayoutAttribute(LayoutAttribute attribute);
/// The enumerator's name.
std::string_view nameOfLayoutAttribute(LayoutAttribute attribute);

}  // namespace nimbo
