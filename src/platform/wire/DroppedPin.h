#pragma once

#include "platform/wire/Record.h"
#include "platform/wire/Scalar.h"

namespace nimbo {

class DroppedPin;

struct DroppedPinFields {
  Scalar<double> latitude;
  Scalar<double> longitude;
  std::optional<std::string> title;
};

extern template class Record<DroppedPin, DroppedPinFields>;

/// A pin that the user set on the map.
class DroppedPin final : public Record<DroppedPin, DroppedPinFields> {
 public:
  /// Degrees north, WGS 84.
  double latitude() const { return _fields.latitude.value; }
  void setLatitude(double value) { _fields.latitude.set(value); }
  bool hasLatitude() const { return _fields.latitude.isPresent; }
  void setHasLatitude(bool present) { _fields.latitude.isPresent = present; }

  /// Degrees east, WGS 84.
  double longitude() const { return _fields.longitude.value; }
  void setLongitude(double value) { _fields.longitude.set(value); }
  bool hasLongitude() const { return _fields.longitude.isPresent; }
  void setHasLongitude(bool present) { _fields.longitude.isPresent = present; }

  /// The user's own name for it.
  const std::optional<std::string>& title() const { return _fields.title; }
  void setTitle(std::optional<std::string> value) { _fields.title = std::move(value); }
  bool hasTitle() const { return _fields.title.has_value(); }

  std::string_view className() const override { return "DroppedPin"; }
};

}  // namespace nimbo
