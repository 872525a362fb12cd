#include "handoff/NimboActivity.h"

#include <stdexcept>

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<NimboActivityFields> {
  static constexpr std::tuple fields{
      Field{1, "displayOptions", &NimboActivityFields::displayOptions},
      Field{2, "collectionsMode", &NimboActivityFields::collectionsMode},
      Field{3, "searchString", &NimboActivityFields::searchString},
      Field{4, "searchPlaces", &NimboActivityFields::searchPlaces},
      Field{5, "selectedPlaceIndex", &NimboActivityFields::selectedPlaceIndex},
      Field{6, "isPresentingSelectedPlace", &NimboActivityFields::isPresentingSelectedPlace},
      Field{7, "directionsPlan", &NimboActivityFields::directionsPlan},
      Field{8, "droppedPin", &NimboActivityFields::droppedPin},
      Field{9, "isDroppedPinSelected", &NimboActivityFields::isDroppedPinSelected},
      Field{10, "isDroppedPinPresented", &NimboActivityFields::isDroppedPinPresented},
      Field{11, "presentedMapItem", &NimboActivityFields::presentedMapItem},
      Field{12, "searchCategoryStorage", &NimboActivityFields::searchCategoryStorage},
      Field{13, "selectedTransitFeatureID", &NimboActivityFields::selectedTransitFeatureID},
      Field{14, "selectedTransitLineName", &NimboActivityFields::selectedTransitLineName},
      Field{15, "lineItem", &NimboActivityFields::lineItem}};
};

template class Record<NimboActivity, NimboActivityFields>;

void NimboActivity::clearSearchPlaces() {
  if (_fields.searchPlaces) _fields.searchPlaces->clear();
}

void NimboActivity::addSearchPlaces(std::shared_ptr<StoredMapItem> place) {
  if (!place) throw std::invalid_argument("a search place must not be null");
  if (!_fields.searchPlaces) _fields.searchPlaces = std::make_shared<SearchPlaces>();
  _fields.searchPlaces->push_back(std::move(place));
}

const std::shared_ptr<StoredMapItem>& NimboActivity::searchPlacesAtIndex(std::size_t index) const {
  if (index >= searchPlacesCount()) throw std::out_of_range("no search place at index " + std::to_string(index));
  return (*_fields.searchPlaces)[index];
}

}  // namespace nimbo
