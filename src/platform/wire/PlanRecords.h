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

class StoredSearchCategory;

struct StoredSearchCategoryFields {
  std::optional<std::string> identifier;
  std::optional<std::string> displayName;
};

extern template class Record<StoredSearchCategory, StoredSearchCategoryFields>;

/// A category to search in, such as restaurants.
class StoredSearchCategory final : public Record<StoredSearchCategory, StoredSearchCategoryFields> {
 public:
  /// The same in every language.
  const std::optional<std::string>& identifier() const { return _fields.identifier; }
  void setIdentifier(std::optional<std::string> value) { _fields.identifier = std::move(value); }
  bool hasIdentifier() const { return _fields.identifier.has_value(); }

  /// In the user's language.
  const std::optional<std::string>& displayName() const { return _fields.displayName; }
  void setDisplayName(std::optional<std::string> value) { _fields.displayName = std::move(value); }
  bool hasDisplayName() const { return _fields.displayName.has_value(); }

  std::string_view className() const override { return "StoredSearchCategory"; }
};

class StoredMapItem;

struct StoredMapItemFields {
  Scalar<std::uint64_t> muid;
  std::optional<std::string> name;
  Scalar<double> latitude;
  Scalar<double> longitude;
};

extern template class Record<StoredMapItem, StoredMapItemFields>;

/// A place of the map, as a search finds it.
class StoredMapItem final : public Record<StoredMapItem, StoredMapItemFields> {
 public:
  /// The place's number.
  std::uint64_t muid() const { return _fields.muid.value; }
  void setMuid(std::uint64_t value) { _fields.muid.set(value); }
  bool hasMuid() const { return _fields.muid.isPresent; }
  void setHasMuid(bool present) { _fields.muid.isPresent = present; }

  const std::optional<std::string>& name() const { return _fields.name; }
  void setName(std::optional<std::string> value) { _fields.name = std::move(value); }
  bool hasName() const { return _fields.name.has_value(); }

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

  std::string_view className() const override { return "StoredMapItem"; }
};

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

class StoredRouteRequest;

struct StoredRouteRequestFields {
  std::shared_ptr<StoredMapItem> origin;
  std::shared_ptr<StoredMapItem> destination;
  Scalar<std::int32_t> transportType;
};

extern template class Record<StoredRouteRequest, StoredRouteRequestFields>;

/// What directions were asked for.
class StoredRouteRequest final : public Record<StoredRouteRequest, StoredRouteRequestFields> {
 public:
  const std::shared_ptr<StoredMapItem>& origin() const { return _fields.origin; }
  void setOrigin(std::shared_ptr<StoredMapItem> value) { _fields.origin = std::move(value); }
  bool hasOrigin() const { return _fields.origin != nullptr; }

  const std::shared_ptr<StoredMapItem>& destination() const { return _fields.destination; }
  void setDestination(std::shared_ptr<StoredMapItem> value) { _fields.destination = std::move(value); }
  bool hasDestination() const { return _fields.destination != nullptr; }

  /// A means of travel, as the map application numbers them.
  std::int32_t transportType() const { return _fields.transportType.value; }
  void setTransportType(std::int32_t value) { _fields.transportType.set(value); }
  bool hasTransportType() const { return _fields.transportType.isPresent; }
  void setHasTransportType(bool present) { _fields.transportType.isPresent = present; }

  std::string_view className() const override { return "StoredRouteRequest"; }
};

}  // namespace nimbo
