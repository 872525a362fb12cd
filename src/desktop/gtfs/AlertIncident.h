#pragma once

#include "platform/transit/TransitIncident.h"

namespace nimbo {

/// One period of an alert as an incident. Alerts come with hundreds of periods: all of one alert share its texts.
class AlertIncident final : public FieldsTransitIncident {
 public:
  using Fields = TransitIncidentFields;

  /// `alert` is not null; its dates and its blocking flag play no part.
  AlertIncident(std::shared_ptr<const Fields> alert, std::optional<Date> startDate, std::optional<Date> endDate,
                bool isBlocking)
      : _alert(std::move(alert)), _startDate(startDate), _endDate(endDate), _isBlocking(isBlocking) {}

  const Fields& fields() const override { return *_alert; }
  std::optional<Date> startDate() const override { return _startDate; }
  std::optional<Date> endDate() const override { return _endDate; }
  bool isBlockingIncident() const override { return _isBlocking; }
  std::string_view className() const override { return "AlertIncident"; }

 private:
  std::shared_ptr<const Fields> _alert;
  std::optional<Date> _startDate;
  std::optional<Date> _endDate;
  bool _isBlocking;
};

}  // namespace nimbo
