#pragma once

#include "platform/transit/TransitLine.h"

namespace nimbo {

/// A line item made of plain fields: what favourites keep (without incidents) and what the line service answers.
class BasicTransitLineItem final : public TransitLineItem {
 public:
  struct Fields {
    MapItemIdentifierRef identifier;  ///< not null
    std::optional<std::string> name;
    TransitSystemRef system;
    TransitArtworkRef artwork;
    TransitArtworkRef modeArtwork;
    TransitArtworkRef alternateArtwork;
    std::optional<std::string> lineColorString;
    bool isBus = false;
    TransitIncidents incidents;
  };

  /// Throws std::invalid_argument without an identifier.
  explicit BasicTransitLineItem(Fields fields);

  std::uint64_t muid() const override { return _fields.identifier->muid(); }
  const MapItemIdentifierRef& identifier() const override { return _fields.identifier; }
  const std::optional<std::string>& name() const override { return _fields.name; }
  const TransitSystemRef& system() const override { return _fields.system; }
  std::int64_t departureTimeDisplayStyle() const override { return 0; }
  bool departuresAreVehicleSpecific() const override { return false; }
  const TransitArtworkRef& artwork() const override { return _fields.artwork; }
  const TransitArtworkRef& modeArtwork() const override { return _fields.modeArtwork; }
  const TransitArtworkRef& alternateArtwork() const override { return _fields.alternateArtwork; }
  bool hasLineColorString() const override { return _fields.lineColorString.has_value(); }
  const std::optional<std::string>& lineColorString() const override { return _fields.lineColorString; }
  bool showVehicleNumber() const override { return false; }
  const ObjectRef& operatingHours() const override { return _noOperatingHours; }
  bool isBus() const override { return _fields.isBus; }
  const TransitIncidents& incidents() const override { return _fields.incidents; }

  std::string_view className() const override { return "BasicTransitLineItem"; }
  /// The class name, the number and the name.
  std::string description() const override;

 private:
  Fields _fields;
  ObjectRef _noOperatingHours;
};

}  // namespace nimbo
