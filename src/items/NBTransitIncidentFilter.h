#pragma once

#include "platform/transit/TransitIncident.h"

namespace nimbo {

/// Decides which incidents are shown: those in force at this moment.
class NBTransitIncidentFilter : public Object {
 public:
  /// Whether the incident has started and has not ended. A date that is missing does not count; one that is exactly
  /// now is inside.
  virtual bool shouldDisplayIncident(const TransitIncident& incident) const;

  std::string_view className() const override { return "NBTransitIncidentFilter"; }
};

}  // namespace nimbo
