#include "platform/wire/StoredTransitLineItem.h"

#include <algorithm>

#include "platform/wire/RecordImplementation.h"
#include "platform/wire/TransitFieldTables.h"

namespace nimbo {

template <>
struct RecordTable<StoredTransitLineItemFields> {
  using Fields = StoredTransitLineItemFields;
  static constexpr std::tuple fields{Field{1, "identifier", &Fields::identifier},
                                     Field{2, "name", &Fields::name},
                                     Field{3, "system", &Fields::system},
                                     Field{4, "artwork", &Fields::artwork},
                                     Field{5, "modeArtwork", &Fields::modeArtwork},
                                     Field{6, "alternateArtwork", &Fields::alternateArtwork},
                                     Field{7, "lineColorString", &Fields::lineColorString},
                                     Field{8, "isBus", &Fields::isBus},
                                     Field{9, "departureTimeDisplayStyle", &Fields::departureTimeDisplayStyle},
                                     Field{10, "departuresAreVehicleSpecific", &Fields::departuresAreVehicleSpecific},
                                     Field{11, "showVehicleNumber", &Fields::showVehicleNumber},
                                     Field{12, "hasEncyclopedicInfo", &Fields::hasEncyclopedicInfo},
                                     Field{13, "isIncidentsTTLExpired", &Fields::isIncidentsTTLExpired},
                                     Field{14, "hasIncidentComponent", &Fields::hasIncidentComponent},
                                     Field{15, "incidents", &Fields::incidents}};
};

template class Record<StoredTransitLineItem, StoredTransitLineItemFields, TransitLineItem>;

std::shared_ptr<StoredTransitLineItem> StoredTransitLineItem::initWithLineItem(const TransitLineItemRef& lineItem) {
  if (!lineItem) return nullptr;
  StoredTransitLineItemFields fields;
  fields.identifier = lineItem->identifier();
  fields.name = lineItem->name();
  fields.system = lineItem->system();
  fields.artwork = lineItem->artwork();
  fields.modeArtwork = lineItem->modeArtwork();
  fields.alternateArtwork = lineItem->alternateArtwork();
  fields.lineColorString = lineItem->lineColorString();
  fields.isBus = lineItem->isBus();
  fields.departureTimeDisplayStyle = lineItem->departureTimeDisplayStyle();
  fields.departuresAreVehicleSpecific = lineItem->departuresAreVehicleSpecific();
  fields.showVehicleNumber = lineItem->showVehicleNumber();
  fields.hasEncyclopedicInfo = lineItem->hasEncyclopedicInfo();
  fields.isIncidentsTTLExpired = lineItem->isIncidentsTTLExpired();
  if (!lineItem->hasIncidentComponent()) fields.hasIncidentComponent.set(false);
  fields.incidents.reserve(lineItem->incidents().size());
  for (const TransitIncidentRef& incident : lineItem->incidents())
    if (incident) fields.incidents.push_back(StoredTransitIncident::initWithIncident(incident));
  return std::make_shared<StoredTransitLineItem>(std::move(fields));
}

bool StoredTransitLineItem::areAlike(const TransitLineItem& a, const TransitLineItem& b) {
  return &a == &b ||
         (a.muid() == b.muid() && a.identifier()->locator() == b.identifier()->locator() && a.name() == b.name() &&
          membersAreEqual(a.system(), b.system()) && membersAreEqual(a.artwork(), b.artwork()) &&
          membersAreEqual(a.modeArtwork(), b.modeArtwork()) &&
          membersAreEqual(a.alternateArtwork(), b.alternateArtwork()) && a.lineColorString() == b.lineColorString() &&
          a.isBus() == b.isBus() && a.departureTimeDisplayStyle() == b.departureTimeDisplayStyle() &&
          a.departuresAreVehicleSpecific() == b.departuresAreVehicleSpecific() &&
          a.showVehicleNumber() == b.showVehicleNumber() && a.hasEncyclopedicInfo() == b.hasEncyclopedicInfo() &&
          a.isIncidentsTTLExpired() == b.isIncidentsTTLExpired() &&
          a.hasIncidentComponent() == b.hasIncidentComponent() &&
          std::ranges::equal(a.incidents(), b.incidents(), [](const auto& one, const auto& other) {
            return one && other ? StoredTransitIncident::areAlike(*one, *other) : one == other;
          }));
}

const MapItemIdentifierRef& StoredTransitLineItem::identifier() const {
  static const auto none = std::make_shared<const MapItemIdentifier>(0);
  return _fields.identifier ? _fields.identifier : none;
}

const ObjectRef& StoredTransitLineItem::operatingHours() const {
  static const ObjectRef absent;
  return absent;
}

const ArchivableClass& StoredTransitLineItem::archivedClass() {
  static constexpr ArchivableClass archived{"StoredTransitLineItem", decodeRecord<StoredTransitLineItem>};
  return archived;
}

void StoredTransitLineItem::encodeWithCoder(KeyedEncoder& coder) const { encodeRecord(*this, coder); }

std::string StoredTransitLineItem::description() const {
  return "<StoredTransitLineItem: " + std::to_string(muid()) + " " + name().value_or("(no name)") + ">";
}

}  // namespace nimbo
