#include "platform/wire/StoredTransitIncident.h"

#include "platform/wire/RecordImplementation.h"
#include "platform/wire/TransitFieldTables.h"

namespace nimbo {

template class Record<StoredTransitIncident, TransitIncidentFields, FieldsTransitIncident>;

std::shared_ptr<const StoredTransitIncident> StoredTransitIncident::initWithIncident(
    const TransitIncidentRef& incident) {
  if (!incident) return nullptr;
  if (auto stored = std::dynamic_pointer_cast<const StoredTransitIncident>(incident)) return stored;
  return std::make_shared<const StoredTransitIncident>(fieldsOf(*incident));
}

bool StoredTransitIncident::areAlike(const TransitIncident& a, const TransitIncident& b) {
  return &a == &b ||
         (a.muid() == b.muid() && a.title() == b.title() && a.summary() == b.summary() &&
          a.fullDescription() == b.fullDescription() && a.messageForRoutePlanning() == b.messageForRoutePlanning() &&
          a.messageForRouteStepping() == b.messageForRouteStepping() &&
          a.messageForNonRoutable() == b.messageForNonRoutable() && a.startDate() == b.startDate() &&
          a.endDate() == b.endDate() && a.creationDate() == b.creationDate() && a.lastUpdated() == b.lastUpdated() &&
          a.iconType() == b.iconType() && a.isBlockingIncident() == b.isBlockingIncident() &&
          membersAreEqual(a.affectedEntities(), b.affectedEntities()) && a.linkURL() == b.linkURL());
}

const ArchivableClass& StoredTransitIncident::archivedClass() {
  static constexpr ArchivableClass archived{"StoredTransitIncident", decodeRecord<StoredTransitIncident>};
  return archived;
}

void StoredTransitIncident::encodeWithCoder(KeyedEncoder& coder) const { encodeRecord(*this, coder); }

}  // namespace nimbo
