#pragma once

#include "platform/transit/TransitIncident.h"

namespace nimbo {

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

/// An incident made of plain fields.
class BasicTransitIncident final : public TransitIncident {
 public:
  struct Fields {
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

  explicit BasicTransitIncident(Fields fields) : _fields(std::move(fields)) {}
  const Fields& fields() const { return _fields; }

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

  std::string_view className() const override { return "BasicTransitIncident"; }
  /// The class name, the number and the title.
  std::string description() const override {
    return "<BasicTransitIncident: " + std::to_string(_fields.muid) + " " + _fields.title.value_or("(no title)") + ">";
  }

 private:
  Fields _fields;
};

}  // namespace nimbo
