#include "platform/wire/DroppedPin.h"

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<DroppedPinFields> {
  static constexpr std::tuple fields{Field{1, "latitude", &DroppedPinFields::latitude},
                                     Field{2, "longitude", &DroppedPinFields::longitude},
                                     Field{3, "title", &DroppedPinFields::title}};
};

template class Record<DroppedPin, DroppedPinFields>;

}  // namespace nimbo
