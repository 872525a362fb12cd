#include "platform/transit/TransitIncident.h"

namespace nimbo {

const std::optional<std::string>& TransitIncident::linkURL() const {
  static const std::optional<std::string> absent;
  return absent;
}

std::string FieldsTransitIncident::description() const {
  return "<" + std::string(className()) + ": " + std::to_string(muid()) + " " + title().value_or("(no title)") + ">";
}

}  // namespace nimbo
