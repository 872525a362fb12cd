#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/transit/MapItemIdentifier.h"
#include "platform/transit/TransitArtwork.h"
#include "platform/transit/TransitIncident.h"

namespace nimbo {

/// The network that a line belongs to: one for each agency. Immutable.
class TransitSystem final : public Object {
 public:
  TransitSystem(std::uint64_t muid, std::optional<std::string> name, TransitArtworkRef artwork)
      : _muid(muid), _name(std::move(name)), _artwork(std::move(artwork)) {}

  std::uint64_t muid() const { return _muid; }
  const std::optional<std::string>& name() const { return _name; }
  /// The symbol of the mode that all lines of the system share; null when they share none.
  const TransitArtworkRef& artwork() const { return _artwork; }

  std::string_view className() const override { return "TransitSystem"; }

 private:
  std::uint64_t _muid;
  std::optional<std::string> _name;
  TransitArtworkRef _artwork;
};

using TransitSystemRef = std::shared_ptr<const TransitSystem>;

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
