#pragma once

#include "platform/archive/SecureCoding.h"
#include "platform/transit/TransitLine.h"
#include "platform/wire/Record.h"
#include "platform/wire/Scalar.h"

namespace nimbo {

class StoredTransitLineItem;

struct StoredTransitLineItemFields {
  MapItemIdentifierRef identifier;
  std::optional<std::string> name;
  TransitSystemRef system;
  TransitArtworkRef artwork;
  TransitArtworkRef modeArtwork;
  TransitArtworkRef alternateArtwork;
  std::optional<std::string> lineColorString;
  bool isBus = false;
  std::int64_t departureTimeDisplayStyle = 0;
  bool departuresAreVehicleSpecific = false;
  bool showVehicleNumber = false;
  bool hasEncyclopedicInfo = false;
  bool isIncidentsTTLExpired = false;
  Scalar<bool> hasIncidentComponent;  ///< absent: YES
  TransitIncidents incidents;         ///< each a StoredTransitIncident
};

extern template class Record<StoredTransitLineItem, StoredTransitLineItemFields, TransitLineItem>;

/// A snapshot of a line item for archives and hand-offs: answers all that the item answered, so that rows are built
/// from it as from a fetched one. Hours, label items, attribution, region and encyclopedic info, which no service here
/// gives, are absent.
class StoredTransitLineItem final : public Record<StoredTransitLineItem, StoredTransitLineItemFields, TransitLineItem>,
                                    public SecureCoding {
 public:
  using Record::Record;

  /// The item's snapshot, or null for null.
  static std::shared_ptr<StoredTransitLineItem> initWithLineItem(const TransitLineItemRef& lineItem);
  /// Whether the snapshots of both are equal. Makes none.
  static bool areAlike(const TransitLineItem& a, const TransitLineItem& b);

  std::uint64_t muid() const override { return identifier()->muid(); }
  /// The number 0 while the record has none.
  const MapItemIdentifierRef& identifier() const override;
  const std::optional<std::string>& name() const override { return _fields.name; }
  const TransitSystemRef& system() const override { return _fields.system; }
  std::int64_t departureTimeDisplayStyle() const override { return _fields.departureTimeDisplayStyle; }
  bool departuresAreVehicleSpecific() const override { return _fields.departuresAreVehicleSpecific; }
  const TransitArtworkRef& artwork() const override { return _fields.artwork; }
  const TransitArtworkRef& modeArtwork() const override { return _fields.modeArtwork; }
  const TransitArtworkRef& alternateArtwork() const override { return _fields.alternateArtwork; }
  bool hasLineColorString() const override { return _fields.lineColorString.has_value(); }
  const std::optional<std::string>& lineColorString() const override { return _fields.lineColorString; }
  bool showVehicleNumber() const override { return _fields.showVehicleNumber; }
  const ObjectRef& operatingHours() const override;
  bool isBus() const override { return _fields.isBus; }
  const TransitIncidents& incidents() const override { return _fields.incidents; }
  bool hasEncyclopedicInfo() const override { return _fields.hasEncyclopedicInfo; }
  bool isIncidentsTTLExpired() const override { return _fields.isIncidentsTTLExpired; }
  bool hasIncidentComponent() const override {
    return !_fields.hasIncidentComponent.isPresent || _fields.hasIncidentComponent.value;
  }

  static const ArchivableClass& archivedClass();
  const ArchivableClass& archivableClass() const override { return archivedClass(); }
  void encodeWithCoder(KeyedEncoder& coder) const override;

  std::string_view className() const override { return "StoredTransitLineItem"; }
  /// The class name, the number and the name.
  std::string description() const override;
};

}  // namespace nimbo
