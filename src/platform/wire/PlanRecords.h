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
  void setMapType(std::int32_t value) { _fields.mapType.set(value); }

  std::string_view className() const override { return "MapDisplayOptions"; }
};

class StoredSearchCategory;

struct StoredSearchCategoryFields {
  std::optional<std::string> identifier;   ///< the same in every language
  std::optional<std::string> displayName;  ///< in the user's language
};

extern template class Record<StoredSearchCategory, StoredSearchCategoryFields>;

/// A category to search in, such as restaurants.
class StoredSearchCategory final : public Record<StoredSearchCategory, StoredSearchCategoryFields> {
 public:
  std::string_view className() const override { return "StoredSearchCategory"; }
};

class StoredMapItem;

struct StoredMapItemFields {
  Scalar<std::uint64_t> muid;
  std::optional<std::string> name;
  Scalar<double> latitude;  ///< degrees, WGS 84
  Scalar<double> longitude;
};

extern template class Record<StoredMapItem, StoredMapItemFields>;

/// A place of the map, as a search finds it.
class StoredMapItem final : public Record<StoredMapItem, StoredMapItemFields> {
 public:
  std::string_view className() const override { return "StoredMapItem"; }
};

class DroppedPin;

struct DroppedPinFields {
  Scalar<double> latitude;  ///< degrees, WGS 84
  Scalar<double> longitude;
  std::optional<std::string> title;
};

extern template class Record<DroppedPin, DroppedPinFields>;

/// A pin that the user set on the map, with the user's own name for it.
class DroppedPin final : public Record<DroppedPin, DroppedPinFields> {
 public:
  std::string_view className() const override { return "DroppedPin"; }
};

class StoredRouteRequest;

struct StoredRouteRequestFields {
  std::shared_ptr<StoredMapItem> origin;
  std::shared_ptr<StoredMapItem> destination;
  Scalar<std::int32_t> transportType;  ///< as the map application numbers them
};

extern template class Record<StoredRouteRequest, StoredRouteRequestFields>;

/// What directions were asked for.
class StoredRouteRequest final : public Record<StoredRouteRequest, StoredRouteRequestFields> {
 public:
  std::string_view className() const override { return "StoredRouteRequest"; }
};

}  // namespace nimbo
