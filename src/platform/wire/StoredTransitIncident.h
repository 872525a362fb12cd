#pragma once

#include "platform/archive/SecureCoding.h"
#include "platform/transit/BasicTransitIncident.h"
#include "platform/wire/Record.h"

namespace nimbo {

class StoredTransitIncident;
template <class Class>
struct WireObject;
extern template class Record<StoredTransitIncident, BasicTransitIncident::Fields, TransitIncident>;

/// A snapshot of an incident for archives and hand-offs: answers all that the incident answered.
class StoredTransitIncident final : public Record<StoredTransitIncident, BasicTransitIncident::Fields, TransitIncident>,
                                    public SecureCoding {
 public:
  using Record::Record;

  /// The incident's snapshot; itself when it is one already, null for null.
  static std::shared_ptr<const StoredTransitIncident> initWithIncident(const TransitIncidentRef& incident);

  std::uint64_t muid() const override { return _fields.muid; }
  const std::optional<std::string>& title() const override { return _fields.title; }
  const std::optional<std::string>& summary() const override { return _fields.summary; }
  const std::optional<std::string>& fullDescription() const override { return _fields.fullDescription; }
  const std::optional<std::string>& messageForRoutePlanning() const override { return _fields.messageForRoutePlanning; }
  const std::optional<std::string>& messageForRouteStepping() const override { return _fields.messageForRouteStepping; }
  const std::optional<std::string>& messageForNonRoutable() const override { return _fields.messageForNonRoutable; }
  std::optional<Date> startDate() const override { return _fields.startDate; }
  std::optional<Date> endDate() const override { return _fields.endDate; }
  std::optional<Date> creationDate() const override { return _fields.creationDate; }
  std::optional<Date> lastUpdated() const override { return _fields.lastUpdated; }
  std::int32_t iconType() const override { return _fields.iconType; }
  bool isBlockingIncident() const override { return _fields.isBlockingIncident; }
  const TransitIncidentAffectedEntities& affectedEntities() const override { return _fields.affectedEntities; }
  const std::optional<std::string>& linkURL() const override { return _fields.linkURL; }

  static const ArchivableClass& archivedClass();
  const ArchivableClass& archivableClass() const override { return archivedClass(); }
  void encodeWithCoder(KeyedEncoder& coder) const override;

  std::string_view className() const override { return "StoredTransitIncident"; }
  /// The class name, the number and the title.
  std::string description() const override;

 private:
  template <class Class>
  friend struct WireObject;
};

}  // namespace nimbo
