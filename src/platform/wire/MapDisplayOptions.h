#pragma once

#include "platform/wire/Record.h"
#include "platform/wire/Scalar.h"

namespace nimbo {

class MapDisplayOptions;

struct MapDisplayOptionsFields {
  Scalar<std::int32_t> mapType;
};

extern template class Record<MapDisplayOptions, MapDisplayOptionsFields>;

/// How the map application shows its map.
class MapDisplayOptions final : public Record<MapDisplayOptions, MapDisplayOptionsFields> {
 public:
  /// Such as `kMapTypeTransit`.
  std::int32_t mapType() const { return _fields.mapType.value; }
  void setMapType(std::int32_t value) { _fields.mapType.set(value); }
  bool hasMapType() const { return _fields.mapType.isPresent; }
  void setHasMapType(bool present) { _fields.mapType.isPresent = present; }

  std::string_view className() const override { return "MapDisplayOptions"; }
};

}  // namespace nimbo
