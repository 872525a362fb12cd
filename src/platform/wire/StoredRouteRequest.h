#pragma once

#include "platform/wire/Record.h"
#include "platform/wire/Scalar.h"
#include "platform/wire/StoredMapItem.h"

namespace nimbo {

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
