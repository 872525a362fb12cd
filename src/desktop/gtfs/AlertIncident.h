#pragma once

#include "platform/transit/BasicTransitIncident.h"

namespace nimbo {

/// One period of an alert as an incident. Alerts come with hundreds of periods: all of one alert share its texts.
class AlertIncident final : public TransitIncident {
 public:
  using Fields = BasicTransitIncident::Fields;

  /// `alert` is not null; its dates and its blocking flag play no part.
  AlertIncident(std::shared_ptr<const Fields> alert, std::optional<Date> startDate, std::optional<Date> endDate,
                bool isBlocking)
      : _alert(std::move(alert)), _startDate(startDate), _endDate(endDate), _isBlocking(isBlocking) {}

  std::uint64_t muid() const override { return _alert->muid; }
  const std::optional<std::string>& title() const override { return _alert->title; }
  const std::optional<std::string>& summary() const override { return _alert->summary; }
  const std::optional<std::string>& fullDescription() const override { return _alert->fullDescription; }
  const std::optional<std::string>& messageForRoutePlanning() const override { return _alert->messageForRoutePlanning; }
  const std::optional<std::string>& messageForRouteStepping() const override { return _alert->messageForRouteStepping; }
  const std::optional<std::string>& messageForNonRoutable() const override { return _alert->messageForNonRoutable; }
  std::optional<Date> startDate() const override { return _startDate; }
  std::optional<Date> endDate() const override { return _endDate; }
  std::optional<Date> creationDate() const override { return _alert->creationDate; }
  std::optional<Date> lastUpdated() const override { return _alert->lastUpdated; }
  std::int32_t iconType() const override { return _alert->iconType; }
  bool isBlockingIncident() const override { return _isBlocking; }
  const TransitIncidentAffectedEntities& affectedEntities() const override { return _alert->affectedEntities; }
  const std::optional<std::string>& linkURL() const override { return _alert->linkURL; }

  std::string_view className() const override { return "AlertIncident"; }
  std::string description() const override {
    return "<AlertIncident: " + std::to_string(muid()) + " " + title().value_or("(no title)") + ">";
  }

 private:
  std::shared_ptr<const Fields> _alert;
  std::optional<Date> _startDate;
  std::optional<Date> _endDate;
  bool _isBlocking;
};

}  // namespace nimbo
