#pragma once

#include <memory>
#include <string_view>

#include "platform/transit/TransitIncident.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// Shared setting, a boolean for internal testing: favourite lines without incidents may show made-up ones.
inline constexpr std::string_view kNimboTransitWidgetDebugInjectFakeIncidents =
    "Nimbo.TransitWidget.internal.injectFakeIncidents";

/// Shared setting, a boolean: such a line shows none, one or two of them instead of one.
inline constexpr std::string_view kNimboTransitWidgetDebugRandomNumberIncidents =
    "Nimbo.TransitWidget.internal.randomNumberIncidents";

/// The line that a made-up incident affects, whole.
class DebugAffectedEntities final : public TransitIncidentAffectedEntity {
 public:
  static std::shared_ptr<const DebugAffectedEntities> initWithMuid(std::uint64_t muid) {
    return std::make_shared<const DebugAffectedEntities>(muid);
  }
  explicit DebugAffectedEntities(std::uint64_t muid) : _muid(muid) {}

  std::uint64_t muid() const override { return _muid; }
  bool hasNextStopIDs() const override { return false; }
  std::optional<std::vector<std::uint64_t>> nextStopIDs() const override { return std::nullopt; }

  std::string_view className() const override { return "DebugAffectedEntities"; }

 private:
  std::uint64_t _muid;
};

/// A made-up incident for internal testing. Nothing is set at first; not changed any more once it is shared.
class DebugTransitIncident final : public TransitIncident {
 public:
  /// A strike on this line, from one day ago until in one day. All of one line have the same number.
  static std::shared_ptr<const DebugTransitIncident> __debug_fakeIncidentAffectingLine(const TransitLineItem& line);

  bool isBlockingIncident() const override { return _blockingIncident; }
  std::int32_t iconType() const override { return _iconType; }
  std::uint64_t muid() const override { return _muid; }
  std::optional<Date> startDate() const override { return _startDate; }
  std::optional<Date> endDate() const override { return _endDate; }
  const std::optional<std::string>& title() const override { return _title; }
  const std::optional<std::string>& summary() const override { return _summary; }
  const std::optional<std::string>& fullDescription() const override { return _fullDescription; }
  const std::optional<std::string>& messageForRoutePlanning() const override { return _messageForRoutePlanning; }
  const std::optional<std::string>& messageForRouteStepping() const override { return _messageForRouteStepping; }
  const std::optional<std::string>& messageForNonRoutable() const override { return _messageForNonRoutable; }
  std::optional<Date> creationDate() const override { return _creationDate; }
  std::optional<Date> lastUpdated() const override { return _lastUpdated; }
  const TransitIncidentAffectedEntities& affectedEntities() const override { return _affectedEntities; }

  void setBlockingIncident(bool blocking) { _blockingIncident = blocking; }
  void setIconType(std::int32_t iconType) { _iconType = iconType; }
  void setMuid(std::uint64_t muid) { _muid = muid; }
  void setStartDate(std::optional<Date> date) { _startDate = date; }
  void setEndDate(std::optional<Date> date) { _endDate = date; }
  void setTitle(std::optional<std::string> text) { _title = std::move(text); }
  void setSummary(std::optional<std::string> text) { _summary = std::move(text); }
  void setFullDescription(std::optional<std::string> text) { _fullDescription = std::move(text); }
  void setMessageForRoutePlanning(std::optional<std::string> text) { _messageForRoutePlanning = std::move(text); }
  void setMessageForRouteStepping(std::optional<std::string> text) { _messageForRouteStepping = std::move(text); }
  void setMessageForNonRoutable(std::optional<std::string> text) { _messageForNonRoutable = std::move(text); }
  void setCreationDate(std::optional<Date> date) { _creationDate = date; }
  void setLastUpdated(std::optional<Date> date) { _lastUpdated = date; }
  void setAffectedEntities(TransitIncidentAffectedEntities entities) { _affectedEntities = std::move(entities); }

  std::string_view className() const override { return "DebugTransitIncident"; }

 private:
  bool _blockingIncident = false;
  std::int32_t _iconType = 0;
  std::uint64_t _muid = 0;
  std::optional<Date> _startDate;
  std::optional<Date> _endDate;
  std::optional<std::string> _title;
  std::optional<std::string> _summary;
  std::optional<std::string> _fullDescription;
  std::optional<std::string> _messageForRoutePlanning;
  std::optional<std::string> _messageForRouteStepping;
  std::optional<std::string> _messageForNonRoutable;
  std::optional<Date> _creationDate;
  std::optional<Date> _lastUpdated;
  TransitIncidentAffectedEntities _affectedEntities;
};

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
