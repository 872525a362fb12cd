#pragma once

#include <utility>

#include "platform/foundation/Error.h"
#include "platform/transit/TransitIncident.h"

namespace nimbo {

/// What is known of a line: it is affected, it is good, or that is unknown, with a reason. There is no way to one that
/// does not say what the evidence lacks.
class Verdict {
 public:
  /// By the line's incidents, in force and to come, and what keeps the evidence from being whole; null where it is.
  static Verdict of(TransitIncidents incidents, ErrorRef gap) {
    return gap ? Verdict({}, std::move(gap)) : Verdict(std::move(incidents), nullptr);
  }

  /// Why nothing is known; null when something is.
  const ErrorRef& unknownReason() const { return _unknownReason; }
  /// None for a line of which nothing is known.
  const TransitIncidents& incidents() const { return _incidents; }
  /// Whether an incident is in force.
  bool isAffected(Date now) const {
    for (const TransitIncidentRef& incident : _incidents) {
      const auto start = incident->startDate(), end = incident->endDate();
      if ((!start || *start <= now) && (!end || *end >= now)) return true;
    }
    return false;
  }
  bool isGood(Date now) const { return !_unknownReason && !isAffected(now); }

 private:
  Verdict(TransitIncidents incidents, ErrorRef unknownReason)
      : _incidents(std::move(incidents)), _unknownReason(std::move(unknownReason)) {}

  TransitIncidents _incidents;
  ErrorRef _unknownReason;
};

}  // namespace nimbo
