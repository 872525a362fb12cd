#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/foundation/Date.h"
#include "platform/foundation/Object.h"

namespace nimbo {

/// A line (or part of one) that an incident affects.
class TransitIncidentAffectedEntity : public Object {
 public:
  /// Number of the line.
  virtual std::uint64_t muid() const = 0;
  virtual bool hasNextStopIDs() const = 0;
  /// Absent where the incident affects the whole line.
  virtual std::optional<std::vector<std::uint64_t>> nextStopIDs() const = 0;
};

using TransitIncidentAffectedEntities = std::vector<std::shared_ptr<const TransitIncidentAffectedEntity>>;

/// A disruption, strike or advisory. Two incidents of the same `muid` are the same incident; one that comes and goes
/// has an object for each of its periods, all of one `muid`. References live as long as the object.
class TransitIncident : public Object {
 public:
  virtual std::uint64_t muid() const = 0;
  /// What happened, in a few words.
  virtual const std::optional<std::string>& title() const = 0;
  /// One sentence or two; absent where the title says it all.
  virtual const std::optional<std::string>& summary() const = 0;
  /// Everything the publisher says.
  virtual const std::optional<std::string>& fullDescription() const = 0;
  virtual const std::optional<std::string>& messageForRoutePlanning() const = 0;
  virtual const std::optional<std::string>& messageForRouteStepping() const = 0;
  virtual const std::optional<std::string>& messageForNonRoutable() const = 0;
  /// Absent: in force since ever.
  virtual std::optional<Date> startDate() const = 0;
  /// Absent: no end known.
  virtual std::optional<Date> endDate() const = 0;
  virtual std::optional<Date> creationDate() const = 0;
  virtual std::optional<Date> lastUpdated() const = 0;
  virtual std::int32_t iconType() const = 0;
  /// Whether the line does not run at all.
  virtual bool isBlockingIncident() const = 0;
  virtual const TransitIncidentAffectedEntities& affectedEntities() const = 0;
  /// The publisher's page about it; absent where there is none.
  virtual const std::optional<std::string>& linkURL() const;
};

/// An affected line, whole.
class BasicAffectedEntity final : public TransitIncidentAffectedEntity {
 public:
  explicit BasicAffectedEntity(std::uint64_t muid) : _muid(muid) {}
  std::uint64_t muid() const override { return _muid; }
  bool hasNextStopIDs() const override { return false; }
  std::optional<std::vector<std::uint64_t>> nextStopIDs() const override { return std::nullopt; }
  std::string_view className() const override { return "BasicAffectedEntity"; }

 private:
  std::uint64_t _muid;
};

/// What an incident says.
struct TransitIncidentFields {
  std::uint64_t muid = 0;
  std::optional<std::string> title;
  std::optional<std::string> summary;
  std::optional<std::string> fullDescription;
  std::optional<std::string> messageForRoutePlanning;
  std::optional<std::string> messageForRouteStepping;
  std::optional<std::string> messageForNonRoutable;
  std::optional<Date> startDate;
  std::optional<Date> endDate;
  std::optional<Date> creationDate;
  std::optional<Date> lastUpdated;
  std::int32_t iconType = 0;
  bool isBlockingIncident = false;
  TransitIncidentAffectedEntities affectedEntities;
  std::optional<std::string> linkURL;
};

/// What any incident says.
inline TransitIncidentFields fieldsOf(const TransitIncident& incident) {
  return {.muid = incident.muid(),
          .title = incident.title(),
          .summary = incident.summary(),
          .fullDescription = incident.fullDescription(),
          .messageForRoutePlanning = incident.messageForRoutePlanning(),
          .messageForRouteStepping = incident.messageForRouteStepping(),
          .messageForNonRoutable = incident.messageForNonRoutable(),
          .startDate = incident.startDate(),
          .endDate = incident.endDate(),
          .creationDate = incident.creationDate(),
          .lastUpdated = incident.lastUpdated(),
          .iconType = incident.iconType(),
          .isBlockingIncident = incident.isBlockingIncident(),
          .affectedEntities = incident.affectedEntities(),
          .linkURL = incident.linkURL()};
}

/// An incident that answers from fields.
class FieldsTransitIncident : public TransitIncident {
 public:
  virtual const TransitIncidentFields& fields() const = 0;

  std::uint64_t muid() const override { return fields().muid; }
  const std::optional<std::string>& title() const override { return fields().title; }
  const std::optional<std::string>& summary() const override { return fields().summary; }
  const std::optional<std::string>& fullDescription() const override { return fields().fullDescription; }
  const std::optional<std::string>& messageForRoutePlanning() const override {
    return fields().messageForRoutePlanning;
  }
  const std::optional<std::string>& messageForRouteStepping() const override {
    return fields().messageForRouteStepping;
  }
  const std::optional<std::string>& messageForNonRoutable() const override { return fields().messageForNonRoutable; }
  std::optional<Date> startDate() const override { return fields().startDate; }
  std::optional<Date> endDate() const override { return fields().endDate; }
  std::optional<Date> creationDate() const override { return fields().creationDate; }
  std::optional<Date> lastUpdated() const override { return fields().lastUpdated; }
  std::int32_t iconType() const override { return fields().iconType; }
  bool isBlockingIncident() const override { return fields().isBlockingIncident; }
  const TransitIncidentAffectedEntities& affectedEntities() const override { return fields().affectedEntities; }
  const std::optional<std::string>& linkURL() const override { return fields().linkURL; }

  /// The class name, the number and the title.
  std::string description() const override;
};

/// An incident that says just these fields.
class BasicTransitIncident final : public FieldsTransitIncident {
 public:
  explicit BasicTransitIncident(TransitIncidentFields fields) : _fields(std::move(fields)) {}
  const TransitIncidentFields& fields() const override { return _fields; }
  std::string_view className() const override { return "BasicTransitIncident"; }

 private:
  TransitIncidentFields _fields;
};

using TransitIncidentRef = std::shared_ptr<const TransitIncident>;
using TransitIncidents = std::vector<TransitIncidentRef>;

}  // namespace nimbo
