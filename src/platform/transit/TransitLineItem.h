#pragma once

#include <memory>
#include <vector>

#include "platform/transit/TransitIncident.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// A line with what happens on it.
class TransitLineItem : public TransitLine {
 public:
  /// In the service's order.
  virtual const TransitIncidents& incidents() const = 0;
  /// Null where the service has none.
  virtual ObjectRef labelItems() const { return nullptr; }
  /// Null where the service has none.
  virtual ObjectRef attribution() const { return nullptr; }
  /// Null where the service has none.
  virtual ObjectRef mapRegion() const { return nullptr; }
  /// Null where the service has none.
  virtual ObjectRef encyclopedicInfo() const { return nullptr; }
  virtual bool hasEncyclopedicInfo() const { return false; }
  virtual bool isIncidentsTTLExpired() const { return false; }
  /// Whether the source says anything of incidents at all.
  virtual bool hasIncidentComponent() const { return true; }
};

using TransitLineItemRef = std::shared_ptr<const TransitLineItem>;
using TransitLineItems = std::vector<TransitLineItemRef>;

}  // namespace nimbo
