#pragma once

#include "handoff/DirectionsPlan.h"
#include "platform/wire/PlanRecords.h"
#include "platform/wire/StoredTransitLineItem.h"

namespace nimbo {

class NimboActivity;

inline constexpr std::string_view kCollectionsModeNames[] = {"None", "Bookmarks", "Recents", "Contacts"};

/// Fields by the numbers 1 to 15, in this order.
struct NimboActivityFields {
  using SearchPlaces = std::vector<std::shared_ptr<StoredMapItem>>;

  std::shared_ptr<MapDisplayOptions> displayOptions;
  NamedScalar<kCollectionsModeNames> collectionsMode;
  std::optional<std::string> searchString;
  std::shared_ptr<SearchPlaces> searchPlaces;
  Scalar<std::uint64_t> selectedPlaceIndex;
  Scalar<bool> isPresentingSelectedPlace;
  std::shared_ptr<DirectionsPlan> directionsPlan;
  std::shared_ptr<DroppedPin> droppedPin;
  Scalar<bool> isDroppedPinSelected;
  Scalar<bool> isDroppedPinPresented;
  std::shared_ptr<StoredMapItem> presentedMapItem;
  std::shared_ptr<StoredSearchCategory> searchCategoryStorage;
  Scalar<std::uint64_t> selectedTransitFeatureID;
  std::optional<std::string> selectedTransitLineName;
  std::shared_ptr<StoredTransitLineItem> lineItem;
};

extern template class Record<NimboActivity, NimboActivityFields>;

/// What the map application shows when it is opened from the widget, as both write it in a hand-off. Setters keep the
/// nested record that they are given; a null or absent value clears the field.
class NimboActivity final : public Record<NimboActivity, NimboActivityFields> {
 public:
  const std::shared_ptr<MapDisplayOptions>& displayOptions() const { return _fields.displayOptions; }
  void setDisplayOptions(std::shared_ptr<MapDisplayOptions> value) { _fields.displayOptions = std::move(value); }
  bool hasDisplayOptions() const { return _fields.displayOptions != nullptr; }

  std::int32_t collectionsMode() const { return _fields.collectionsMode.valueOrZero(); }
  void setCollectionsMode(std::int32_t value) { _fields.collectionsMode.set(value); }
  bool hasCollectionsMode() const { return _fields.collectionsMode.isPresent; }
  void setHasCollectionsMode(bool present) { _fields.collectionsMode.isPresent = present; }
  static std::string collectionsModeAsString(std::int32_t value) { return nameOfValue(kCollectionsModeNames, value); }
  static std::int32_t StringAsCollectionsMode(std::string_view name) {
    return valueOfName(kCollectionsModeNames, name);
  }

  const std::optional<std::string>& searchString() const { return _fields.searchString; }
  void setSearchString(std::optional<std::string> value) { _fields.searchString = std::move(value); }
  bool hasSearchString() const { return _fields.searchString.has_value(); }

  using SearchPlaces = NimboActivityFields::SearchPlaces;
  /// Null until the first place is added or an array is set.
  const std::shared_ptr<SearchPlaces>& searchPlaces() const { return _fields.searchPlaces; }
  void setSearchPlaces(std::shared_ptr<SearchPlaces> value) { _fields.searchPlaces = std::move(value); }
  void clearSearchPlaces();
  void addSearchPlaces(std::shared_ptr<StoredMapItem> place);
  std::size_t searchPlacesCount() const { return _fields.searchPlaces ? _fields.searchPlaces->size() : 0; }
  /// Throws std::out_of_range for an index that is not below the count.
  const std::shared_ptr<StoredMapItem>& searchPlacesAtIndex(std::size_t index) const;
  /// The name of the elements' class.
  static std::string_view searchPlacesType() { return "StoredMapItem"; }

  std::uint64_t selectedPlaceIndex() const { return _fields.selectedPlaceIndex.value; }
  void setSelectedPlaceIndex(std::uint64_t value) { _fields.selectedPlaceIndex.set(value); }
  bool hasSelectedPlaceIndex() const { return _fields.selectedPlaceIndex.isPresent; }
  void setHasSelectedPlaceIndex(bool present) { _fields.selectedPlaceIndex.isPresent = present; }

  bool isPresentingSelectedPlace() const { return _fields.isPresentingSelectedPlace.value; }
  void setIsPresentingSelectedPlace(bool value) { _fields.isPresentingSelectedPlace.set(value); }
  bool hasIsPresentingSelectedPlace() const { return _fields.isPresentingSelectedPlace.isPresent; }
  void setHasIsPresentingSelectedPlace(bool present) { _fields.isPresentingSelectedPlace.isPresent = present; }

  const std::shared_ptr<DirectionsPlan>& directionsPlan() const { return _fields.directionsPlan; }
  void setDirectionsPlan(std::shared_ptr<DirectionsPlan> value) { _fields.directionsPlan = std::move(value); }
  bool hasDirectionsPlan() const { return _fields.directionsPlan != nullptr; }

  const std::shared_ptr<DroppedPin>& droppedPin() const { return _fields.droppedPin; }
  void setDroppedPin(std::shared_ptr<DroppedPin> value) { _fields.droppedPin = std::move(value); }
  bool hasDroppedPin() const { return _fields.droppedPin != nullptr; }

  bool isDroppedPinSelected() const { return _fields.isDroppedPinSelected.value; }
  void setIsDroppedPinSelected(bool value) { _fields.isDroppedPinSelected.set(value); }
  bool hasIsDroppedPinSelected() const { return _fields.isDroppedPinSelected.isPresent; }
  void setHasIsDroppedPinSelected(bool present) { _fields.isDroppedPinSelected.isPresent = present; }

  bool isDroppedPinPresented() const { return _fields.isDroppedPinPresented.value; }
  void setIsDroppedPinPresented(bool value) { _fields.isDroppedPinPresented.set(value); }
  bool hasIsDroppedPinPresented() const { return _fields.isDroppedPinPresented.isPresent; }
  void setHasIsDroppedPinPresented(bool present) { _fields.isDroppedPinPresented.isPresent = present; }

  const std::shared_ptr<StoredMapItem>& presentedMapItem() const { return _fields.presentedMapItem; }
  void setPresentedMapItem(std::shared_ptr<StoredMapItem> value) { _fields.presentedMapItem = std::move(value); }
  bool hasPresentedMapItem() const { return _fields.presentedMapItem != nullptr; }

  const std::shared_ptr<StoredSearchCategory>& searchCategoryStorage() const { return _fields.searchCategoryStorage; }
  void setSearchCategoryStorage(std::shared_ptr<StoredSearchCategory> value) {
    _fields.searchCategoryStorage = std::move(value);
  }
  bool hasSearchCategoryStorage() const { return _fields.searchCategoryStorage != nullptr; }

  std::uint64_t selectedTransitFeatureID() const { return _fields.selectedTransitFeatureID.value; }
  void setSelectedTransitFeatureID(std::uint64_t value) { _fields.selectedTransitFeatureID.set(value); }
  bool hasSelectedTransitFeatureID() const { return _fields.selectedTransitFeatureID.isPresent; }
  void setHasSelectedTransitFeatureID(bool present) { _fields.selectedTransitFeatureID.isPresent = present; }

  const std::optional<std::string>& selectedTransitLineName() const { return _fields.selectedTransitLineName; }
  void setSelectedTransitLineName(std::optional<std::string> value) {
    _fields.selectedTransitLineName = std::move(value);
  }
  bool hasSelectedTransitLineName() const { return _fields.selectedTransitLineName.has_value(); }

  const std::shared_ptr<StoredTransitLineItem>& lineItem() const { return _fields.lineItem; }
  void setLineItem(std::shared_ptr<StoredTransitLineItem> value) { _fields.lineItem = std::move(value); }
  bool hasLineItem() const { return _fields.lineItem != nullptr; }

  std::string_view className() const override { return "NimboActivity"; }
};

}  // namespace nimbo
