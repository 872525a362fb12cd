#include "platform/transit/TransitIncident.h"

namespace nimbo {

const std::optional<std::string>& TransitIncident::linkURL() const {
  static const std::optional<std::string> absent;
  return absent;
}

}  // namespace nimbo
