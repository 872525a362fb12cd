#include "platform/transit/BasicTransitLineItem.h"

#include <stdexcept>

namespace nimbo {

BasicTransitLineItem::BasicTransitLineItem(Fields fields) : _fields(std::move(fields)) {
  if (!_fields.identifier) throw std::invalid_argument("a line item needs an identifier");
}

std::string BasicTransitLineItem::description() const {
  return "<BasicTransitLineItem: " + std::to_string(muid()) + " " + _fields.name.value_or("(no name)") + ">";
}

}  // namespace nimbo
