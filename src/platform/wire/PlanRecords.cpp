#include "platform/wire/PlanRecords.h"

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<MapDisplayOptionsFields> {
  static constexpr std::tuple fields{Field{1, "mapType", &MapDisplayOptionsFields::mapType}};
};

template class Record<MapDisplayOptions, MapDisplayOptionsFields>;

template <>
struct RecordTable<StoredSearchCategoryFields> {
  static constexpr std::tuple fields{Field{1, "identifier", &StoredSearchCategoryFields::identifier},
                                     Field{2, "displayName", &StoredSearchCategoryFields::displayName}};
};

template class Record<StoredSearchCategory, StoredSearchCategoryFields>;

template <>
struct RecordTable<StoredMapItemFields> {
  static constexpr std::tuple fields{
      Field{1, "muid", &StoredMapItemFields::muid}, Field{2, "name", &StoredMapItemFields::name},
      Field{3, "latitude", &StoredMapItemFields::latitude}, Field{4, "longitude", &StoredMapItemFields::longitude}};
};

template class Record<StoredMapItem, StoredMapItemFields>;

template <>
struct RecordTable<DroppedPinFields> {
  static constexpr std::tuple fields{Field{1, "latitude", &DroppedPinFields::latitude},
                                     Field{2, "longitude", &DroppedPinFields::longitude},
                                     Field{3, "title", &DroppedPinFields::title}};
};

template class Record<DroppedPin, DroppedPinFields>;

template <>
struct RecordTable<StoredRouteRequestFields> {
  static constexpr std::tuple fields{Field{1, "origin", &StoredRouteRequestFields::origin},
                                     Field{2, "destination", &StoredRouteRequestFields::destination},
                                     Field{3, "transportType", &StoredRouteRequestFields::transportType}};
};

template class Record<StoredRouteRequest, StoredRouteRequestFields>;

}  // namespace nimbo
