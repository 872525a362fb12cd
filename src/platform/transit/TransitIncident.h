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

using TransitIncidentRef = std::shared_ptr<const TransitIncident>;
using TransitIncidents = std::vector<TransitIncidentRef>;

}  // namespace nimbo
