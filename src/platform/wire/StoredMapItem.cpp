#include "platform/wire/StoredMapItem.h"

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<StoredMapItemFields> {
  static constexpr std::tuple fields{
      Field{1, "muid", &StoredMapItemFields::muid}, Field{2, "name", &StoredMapItemFields::name},
      Field{3, "latitude", &StoredMapItemFields::latitude}, Field{4, "longitude", &StoredMapItemFields::longitude}};
};

template class Record<StoredMapItem, StoredMapItemFields>;

}  // namespace nimbo
