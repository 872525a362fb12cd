#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "platform/transit/MapItemIdentifier.h"
#include "platform/transit/TransitSystem.h"

namespace nimbo {

/// What a line is, without what happens on it. References live as long as the object.
class TransitLine : public Object {
 public:
  /// The line's number: the same over runs and machines.
  virtual std::uint64_t muid() const = 0;
  /// Never null.
  virtual const MapItemIdentifierRef& identifier() const = 0;
  virtual const std::optional<std::string>& name() const = 0;
  /// Null for a line of no known system.
  virtual const TransitSystemRef& system() const = 0;
  virtual std::int64_t departureTimeDisplayStyle() const = 0;
  virtual bool departuresAreVehicleSpecific() const = 0;
  /// The line's shield with its full name, or null.
  virtual const TransitArtworkRef& artwork() const = 0;
  /// The symbol of the line's mode, or null.
  virtual const TransitArtworkRef& modeArtwork() const = 0;
  /// The line's shield as rows show it, or null.
  virtual const TransitArtworkRef& alternateArtwork() const = 0;
  virtual bool hasLineColorString() const = 0;
  /// "#rrggbb".
  virtual const std::optional<std::string>& lineColorString() const = 0;
  virtual bool showVehicleNumber() const = 0;
  /// Null where they are not known.
  virtual const ObjectRef& operatingHours() const = 0;
  virtual bool isBus() const = 0;
};

using TransitLineRef = std::shared_ptr<const TransitLine>;

}  // namespace nimbo
