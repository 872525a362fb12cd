#pragma once

#include "platform/wire/FieldTable.h"
#include "platform/wire/StoredTransitIncident.h"

// Incidents as messages. The numbers are part of the hand-off and of saved states: they never change.
namespace nimbo {

struct AffectedEntityFields {
  std::uint64_t muid = 0;
  std::optional<std::vector<std::uint64_t>> nextStopIDs;
};

template <>
struct RecordTable<AffectedEntityFields> {
  static constexpr std::tuple fields{Field{1, "muid", &AffectedEntityFields::muid},
                                     Field{2, "nextStopIDs", &AffectedEntityFields::nextStopIDs}};
};

/// What an incident of a record affects.
class StoredAffectedEntity final : public TransitIncidentAffectedEntity {
 public:
  std::uint64_t muid() const override { return fields.muid; }
  bool hasNextStopIDs() const override { return fields.nextStopIDs.has_value(); }
  std::optional<std::vector<std::uint64_t>> nextStopIDs() const override { return fields.nextStopIDs; }
  std::string_view className() const override { return "StoredAffectedEntity"; }

  AffectedEntityFields fields;
};

template <>
struct WireObject<TransitIncidentAffectedEntity> {
  static AffectedEntityFields fields(const TransitIncidentAffectedEntity& entity) {
    return {entity.muid(), entity.nextStopIDs()};
  }
  template <class Fill>
  static std::shared_ptr<const TransitIncidentAffectedEntity> make(Fill fill) {
    const auto entity = std::make_shared<StoredAffectedEntity>();
    return fill(entity->fields) ? entity : nullptr;
  }
};

template <>
struct RecordTable<TransitIncidentFields> {
  using Fields = TransitIncidentFields;
  static constexpr std::tuple fields{Field{1, "muid", &Fields::muid},
                                     Field{2, "title", &Fields::title},
                                     Field{3, "summary", &Fields::summary},
                                     Field{4, "fullDescription", &Fields::fullDescription},
                                     Field{5, "messageForRoutePlanning", &Fields::messageForRoutePlanning},
                                     Field{6, "messageForRouteStepping", &Fields::messageForRouteStepping},
                                     Field{7, "messageForNonRoutable", &Fields::messageForNonRoutable},
                                     Field{8, "startDate", &Fields::startDate},
                                     Field{9, "endDate", &Fields::endDate},
                                     Field{10, "creationDate", &Fields::creationDate},
                                     Field{11, "lastUpdated", &Fields::lastUpdated},
                                     Field{12, "iconType", &Fields::iconType},
                                     Field{13, "isBlockingIncident", &Fields::isBlockingIncident},
                                     Field{14, "affectedEntities", &Fields::affectedEntities},
                                     Field{15, "linkURL", &Fields::linkURL}};
};

/// Only for incidents that are `StoredTransitIncident`s.
template <>
struct WireObject<TransitIncident> {
  static const TransitIncidentFields& fields(const TransitIncident& incident) {
    return static_cast<const StoredTransitIncident&>(incident).fields();
  }
  template <class Fill>
  static TransitIncidentRef make(Fill fill) {
    const auto incident = std::make_shared<StoredTransitIncident>();
    return fill(incident->_fields) ? incident : nullptr;
  }
};

}  // namespace nimbo
