#pragma once

#include "platform/wire/Record.h"
#include "platform/wire/Scalar.h"

namespace nimbo {

class DirectionsPlanTransitPreferences;

/// Fields by the numbers 1 to 4, in this order.
struct DirectionsPlanTransitPreferencesFields {
  Scalar<bool> avoidBusRoutes;
  Scalar<bool> avoidMetroLightRailRoutes;
  Scalar<bool> avoidRailRoutes;
  Scalar<bool> avoidFerryRoutes;
};

extern template class Record<DirectionsPlanTransitPreferences, DirectionsPlanTransitPreferencesFields>;

/// Means of transport that directions do without.
class DirectionsPlanTransitPreferences final
    : public Record<DirectionsPlanTransitPreferences, DirectionsPlanTransitPreferencesFields> {
 public:
  bool avoidBusRoutes() const { return _fields.avoidBusRoutes.value; }
  void setAvoidBusRoutes(bool value) { _fields.avoidBusRoutes.set(value); }
  bool hasAvoidBusRoutes() const { return _fields.avoidBusRoutes.isPresent; }
  void setHasAvoidBusRoutes(bool present) { _fields.avoidBusRoutes.isPresent = present; }

  bool avoidMetroLightRailRoutes() const { return _fields.avoidMetroLightRailRoutes.value; }
  void setAvoidMetroLightRailRoutes(bool value) { _fields.avoidMetroLightRailRoutes.set(value); }
  bool hasAvoidMetroLightRailRoutes() const { return _fields.avoidMetroLightRailRoutes.isPresent; }
  void setHasAvoidMetroLightRailRoutes(bool present) { _fields.avoidMetroLightRailRoutes.isPresent = present; }

  bool avoidRailRoutes() const { return _fields.avoidRailRoutes.value; }
  void setAvoidRailRoutes(bool value) { _fields.avoidRailRoutes.set(value); }
  bool hasAvoidRailRoutes() const { return _fields.avoidRailRoutes.isPresent; }
  void setHasAvoidRailRoutes(bool present) { _fields.avoidRailRoutes.isPresent = present; }

  bool avoidFerryRoutes() const { return _fields.avoidFerryRoutes.value; }
  void setAvoidFerryRoutes(bool value) { _fields.avoidFerryRoutes.set(value); }
  bool hasAvoidFerryRoutes() const { return _fields.avoidFerryRoutes.isPresent; }
  void setHasAvoidFerryRoutes(bool present) { _fields.avoidFerryRoutes.isPresent = present; }
  bool readFrom(ProtobufReader& reader) override;

  std::string_view className() const override { return "DirectionsPlanTransitPreferences"; }
};

/// What `readFrom` does.
bool DirectionsPlanTransitPreferencesReadFrom(DirectionsPlanTransitPreferences& preferences, ProtobufReader& reader);

}  // namespace nimbo
