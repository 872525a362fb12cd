#pragma once

#include <string>

#include "platform/transit/TransitIncident.h"

namespace nimbo {

/// The texts of an incident's row.
class IncidentStringProvider {
 public:
  /// The incident's title, or else its summary; empty without an incident or texts.
  static std::string cellTitleForIncident(const TransitIncident* incident);
  /// The incident's summary, or else its full description; empty where the title shows that text already.
  static std::string cellSecondaryTextForIncident(const TransitIncident* incident);
};

}  // namespace nimbo
