#pragma once

#include "platform/archive/SecureCoding.h"
#include "platform/transit/TransitIncident.h"
#include "platform/wire/Record.h"

namespace nimbo {

class StoredTransitIncident;
template <class Class>
struct WireObject;
extern template class Record<StoredTransitIncident, TransitIncidentFields, FieldsTransitIncident>;

/// A snapshot of an incident for archives and hand-offs: answers all that the incident answered.
class StoredTransitIncident final : public Record<StoredTransitIncident, TransitIncidentFields, FieldsTransitIncident>,
                                    public SecureCoding {
 public:
  using Record::Record;

  /// The incident's snapshot; itself when it is one already, null for null.
  static std::shared_ptr<const StoredTransitIncident> initWithIncident(const TransitIncidentRef& incident);
  /// Whether the snapshots of both are equal. Makes none.
  static bool areAlike(const TransitIncident& a, const TransitIncident& b);

  static const ArchivableClass& archivedClass();
  const ArchivableClass& archivableClass() const override { return archivedClass(); }
  void encodeWithCoder(KeyedEncoder& coder) const override;

  std::string_view className() const override { return "StoredTransitIncident"; }
  std::string description() const override { return FieldsTransitIncident::description(); }

 private:
  template <class Class>
  friend struct WireObject;
};

}  // namespace nimbo
