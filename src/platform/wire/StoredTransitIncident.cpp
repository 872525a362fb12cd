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

const ArchivableClass& StoredTransitIncident::archivedClass() {
  static constexpr ArchivableClass archived{"StoredTransitIncident", decodeRecord<StoredTransitIncident>};
  return archived;
}

void StoredTransitIncident::encodeWithCoder(KeyedEncoder& coder) const { encodeRecord(*this, coder); }

}  // namespace nimbo
