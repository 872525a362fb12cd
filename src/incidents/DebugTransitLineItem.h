#pragma once

#include <memory>

#include "platform/transit/TransitLineItem.h"

namespace nimbo {

/// A line with made-up incidents: in all else the line that it stands for, with nothing of the service's extras.
class DebugTransitLineItem final : public TransitLineItem {
 public:
  /// The line is not null.
  static std::shared_ptr<DebugTransitLineItem> initWithLine_incidents(TransitLineRef line, TransitIncidents incidents) {
    return std::make_shared<DebugTransitLineItem>(std::move(line), std::move(incidents));
  }
  DebugTransitLineItem(TransitLineRef line, TransitIncidents incidents)
      : _incidents(std::move(incidents)), _wrappedLine(std::move(line)) {}

  const TransitLineRef& wrappedLine() const { return _wrappedLine; }
  void setWrappedLine(TransitLineRef line) { _wrappedLine = std::move(line); }
  void setIncidents(TransitIncidents incidents) { _incidents = std::move(incidents); }

  const TransitIncidents& incidents() const override { return _incidents; }
  bool hasIncidentComponent() const override { return true; }
  bool isIncidentsTTLExpired() const override { return false; }

  std::uint64_t muid() const override { return _wrappedLine->muid(); }
  const MapItemIdentifierRef& identifier() const override { return _wrappedLine->identifier(); }
  const std::optional<std::string>& name() const override { return _wrappedLine->name(); }
  const TransitSystemRef& system() const override { return _wrappedLine->system(); }
  std::int64_t departureTimeDisplayStyle() const override { return _wrappedLine->departureTimeDisplayStyle(); }
  bool departuresAreVehicleSpecific() const override { return _wrappedLine->departuresAreVehicleSpecific(); }
  const TransitArtworkRef& artwork() const override { return _wrappedLine->artwork(); }
  const TransitArtworkRef& modeArtwork() const override { return _wrappedLine->modeArtwork(); }
  const TransitArtworkRef& alternateArtwork() const override { return _wrappedLine->alternateArtwork(); }
  bool hasLineColorString() const override { return _wrappedLine->hasLineColorString(); }
  const std::optional<std::string>& lineColorString() const override { return _wrappedLine->lineColorString(); }
  bool showVehicleNumber() const override { return _wrappedLine->showVehicleNumber(); }
  const ObjectRef& operatingHours() const override { return _wrappedLine->operatingHours(); }
  bool isBus() const override { return _wrappedLine->isBus(); }

  std::string_view className() const override { return "DebugTransitLineItem"; }

 private:
  TransitIncidents _incidents;
  TransitLineRef _wrappedLine;
};

}  // namespace nimbo
