#include "platform/wire/StoredRouteRequest.h"

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<StoredRouteRequestFields> {
  static constexpr std::tuple fields{Field{1, "origin", &StoredRouteRequestFields::origin},
                                     Field{2, "destination", &StoredRouteRequestFields::destination},
                                     Field{3, "transportType", &StoredRouteRequestFields::transportType}};
};

template class Record<StoredRouteRequest, StoredRouteRequestFields>;

}  // namespace nimbo
