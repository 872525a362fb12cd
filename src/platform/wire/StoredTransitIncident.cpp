#include "platform/wire/StoredTransitIncident.h"

#include "platform/wire/RecordImplementation.h"
#include "platform/wire/TransitFieldTables.h"

namespace nimbo {

template class Record<StoredTransitIncident, TransitIncidentFields, FieldsTransitIncident>;

std::shared_ptr<const StoredTransitIncident> StoredTransitIncident::initWithIncident(
    const TransitIncidentRef& incident) {
  if (!incident) return nullptr;
  if (auto stored = std::dynamic_pointer_cast<const StoredTransitIncident>(incident)) return stored;
  TransitIncidentFields fields;
  fields.muid = incident->muid();
  fields.title = incident->title();
  fields.summary = incident->summary();
  fields.fullDescription = incident->fullDescription();
  fields.messageForRoutePlanning = incident->messageForRoutePlanning();
  fields.messageForRouteStepping = incident->messageForRouteStepping();
  fields.messageForNonRoutable = incident->messageForNonRoutable();
  fields.startDate = incident->startDate();
  fields.endDate = incident->endDate();
  fields.creationDate = incident->creationDate();
  fields.lastUpdated = incident->lastUpdated();
  fields.iconType = incident->iconType();
  fields.isBlockingIncident = incident->isBlockingIncident();
  fields.affectedEntities = incident->affectedEntities();
  fields.linkURL = incident->linkURL();
  return std::make_shared<const StoredTransitIncident>(std::move(fields));
}

const ArchivableClass& StoredTransitIncident::archivedClass() {
  static constexpr ArchivableClass archived{"StoredTransitIncident", decodeRecord<StoredTransitIncident>};
  return archived;
}

void StoredTransitIncident::encodeWithCoder(KeyedEncoder& coder) const { encodeRecord(*this, coder); }

}  // namespace nimbo
