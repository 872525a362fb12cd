#include "platform/wire/MapDisplayOptions.h"

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<MapDisplayOptionsFields> {
  static constexpr std::tuple fields{Field{1, "mapType", &MapDisplayOptionsFields::mapType}};
};

template class Record<MapDisplayOptions, MapDisplayOptionsFields>;

}  // namespace nimbo
