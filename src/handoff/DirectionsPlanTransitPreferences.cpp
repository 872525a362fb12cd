#include "handoff/DirectionsPlanTransitPreferences.h"

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<DirectionsPlanTransitPreferencesFields> {
  static constexpr std::tuple fields{
      Field{1, "avoidBusRoutes", &DirectionsPlanTransitPreferencesFields::avoidBusRoutes},
      Field{2, "avoidMetroLightRailRoutes", &DirectionsPlanTransitPreferencesFields::avoidMetroLightRailRoutes},
      Field{3, "avoidRailRoutes", &DirectionsPlanTransitPreferencesFields::avoidRailRoutes},
      Field{4, "avoidFerryRoutes", &DirectionsPlanTransitPreferencesFields::avoidFerryRoutes}};
};

template class Record<DirectionsPlanTransitPreferences, DirectionsPlanTransitPreferencesFields>;

bool DirectionsPlanTransitPreferences::readFrom(ProtobufReader& reader) {
  return DirectionsPlanTransitPreferencesReadFrom(*this, reader);
}

bool DirectionsPlanTransitPreferencesReadFrom(DirectionsPlanTransitPreferences& preferences, ProtobufReader& reader) {
  return preferences.Record::readFrom(reader);
}

}  // namespace nimbo
