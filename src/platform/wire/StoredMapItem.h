#pragma once

#include "platform/wire/Record.h"
#include "platform/wire/Scalar.h"

namespace nimbo {

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

}  // namespace nimbo
