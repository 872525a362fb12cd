#include <gtest/gtest.h>

#include "handoff/NimboActivity.h"
#include "platform/foundation/Hash.h"
#include "support/TransitFixtures.h"

namespace nimbo {
namespace {

std::shared_ptr<StoredMapItem> place(const char* name) {
  auto item = std::make_shared<StoredMapItem>();
  item->setName(name);
  return item;
}

std::shared_ptr<DirectionsPlan> plan(const char* origin) {
  auto directions = std::make_shared<DirectionsPlan>();
  directions->setOriginString(origin);
  return directions;
}

TEST(ActivityRecord, EncodesOnlyWhatIsPresentInAscendingOrder) {
  NimboActivity activity;
  EXPECT_TRUE(activity.data().empty());
  activity.setLineItem(StoredTransitLineItem::initWithLineItem(lineItem(1, "A")));
  activity.setDisplayOptions(std::make_shared<MapDisplayOptions>());
  activity.displayOptions()->setMapType(3);
  const Bytes line = activity.lineItem()->data();
  Bytes expected{0x0a, 2, 0x08, 3, 0x7a, static_cast<std::uint8_t>(line.size())};
  expected.insert(expected.end(), line.begin(), line.end());
  ASSERT_LT(line.size(), 128u);
  EXPECT_EQ(activity.data(), expected);

  DirectionsPlan directions;
  directions.setIsPlayingTrace(true);
  directions.setExpiryTime(-2);
  directions.setOriginString("");
  EXPECT_EQ(directions.data(), (Bytes{0x12, 0, 0x89, 0x01, 0, 0, 0, 0, 0, 0, 0, 0xc0, 0xa0, 0x19, 0x01}));
}

TEST(ActivityRecord, ScalarsKeepTheirValueWithoutTheirPresence) {
  NimboActivity activity;
  activity.setCollectionsMode(3);
  activity.setSelectedPlaceIndex(5);
  activity.setHasCollectionsMode(false);
  activity.setHasSelectedPlaceIndex(false);
  EXPECT_EQ(activity.collectionsMode(), 0);  // an enumeration reads as 0 while absent
  EXPECT_EQ(activity.selectedPlaceIndex(), 5u);
  EXPECT_TRUE(activity.isEqual(std::make_shared<NimboActivity>().get()));
  activity.setHasCollectionsMode(true);
  EXPECT_EQ(activity.collectionsMode(), 3);
}

TEST(ActivityRecord, NamesOfEnumerationsGoBothWays) {
  EXPECT_EQ(NimboActivity::collectionsModeAsString(1), "Bookmarks");
  EXPECT_EQ(NimboActivity::collectionsModeAsString(7), "(unknown: 7)");
  EXPECT_EQ(DirectionsPlan::displayMethodAsString(-1), "(unknown: -1)");
  EXPECT_EQ(NimboActivity::StringAsCollectionsMode("Contacts"), 3);
  EXPECT_EQ(NimboActivity::StringAsCollectionsMode("Favorites"), 0);
  EXPECT_EQ(DirectionsPlan::StringAsDisplayMethod("DirectionsStarted"), 2);
  EXPECT_EQ(DirectionsPlan::StringAsTransitPrioritization("TRANSIT_PRIORITIZE_BY_WALKING_DISTANCE"), 3);
}

TEST(ActivityRecord, ASecondMessageReplacesTheFirstAndPlacesAreAppended) {
  NimboActivity first, second;
  first.setDirectionsPlan(plan("from"));
  first.directionsPlan()->setDestinationString("to");
  first.addSearchPlaces(place("1"));
  second.setDirectionsPlan(plan("elsewhere"));
  second.addSearchPlaces(place("2"));
  Bytes both = first.data();
  const Bytes more = second.data();
  both.insert(both.end(), more.begin(), more.end());
  ProtobufReader reader(both);
  NimboActivity read;
  ASSERT_TRUE(read.readFrom(reader));
  EXPECT_TRUE(read.directionsPlan()->isEqual(second.directionsPlan().get()));
  ASSERT_EQ(read.searchPlacesCount(), 2u);
  EXPECT_EQ(read.searchPlacesAtIndex(1)->name(), "2");
  EXPECT_THROW(read.searchPlacesAtIndex(2), std::out_of_range);
}

TEST(ActivityRecord, MergingAddsToWhatIsThere) {
  NimboActivity mine, theirs;
  mine.setDirectionsPlan(plan("from"));
  mine.setSearchString("kept");
  mine.addSearchPlaces(place("1"));
  mine.setIsDroppedPinSelected(true);
  theirs.setDirectionsPlan(std::make_shared<DirectionsPlan>());
  theirs.directionsPlan()->setDepartureTime(1);
  theirs.directionsPlan()->setTransitPreferences(std::make_shared<DirectionsPlanTransitPreferences>());
  theirs.addSearchPlaces(place("2"));
  theirs.setIsDroppedPinSelected(false);
  theirs.setLineItem(StoredTransitLineItem::initWithLineItem(lineItem(1, "A")));
  const auto minePlan = mine.directionsPlan();
  mine.mergeFrom(theirs);
  EXPECT_EQ(mine.directionsPlan(), minePlan);
  EXPECT_EQ(minePlan->originString(), "from");
  EXPECT_EQ(minePlan->departureTime(), 1);
  EXPECT_EQ(minePlan->transitPreferences(), theirs.directionsPlan()->transitPreferences());
  EXPECT_EQ(mine.searchString(), "kept");
  EXPECT_EQ(mine.searchPlacesCount(), 2u);
  EXPECT_FALSE(mine.isDroppedPinSelected());
  EXPECT_EQ(mine.lineItem(), theirs.lineItem());
  mine.mergeFrom(mine);
  EXPECT_EQ(mine.searchPlacesCount(), 4u);

  // Line items, whose values never change, are merged by value: what only mine has stays.
  const auto merged = StoredTransitLineItem::initWithLineItem(lineItem(1, "A", {incident(1)}));
  BasicTransitLineItem::Fields other;
  other.identifier = std::make_shared<const MapItemIdentifier>(0, TransitLineLocator{"feed", "", "", "", {}});
  other.isBus = true;
  merged->mergeFrom(*StoredTransitLineItem::initWithLineItem(std::make_shared<const BasicTransitLineItem>(other)));
  EXPECT_EQ(merged->muid(), 1u);
  EXPECT_EQ(merged->identifier()->locator()->feed, "feed");
  EXPECT_EQ(merged->name(), "A");
  EXPECT_TRUE(merged->isBus());
  EXPECT_EQ(merged->incidents().size(), 1u);
}

TEST(ActivityRecord, CopiesAreDeepOrByReference) {
  NimboActivity source, target;
  source.setDirectionsPlan(plan("from"));
  source.addSearchPlaces(place("1"));
  source.setSelectedPlaceIndex(1);
  target.addSearchPlaces(place("old"));
  target.setSearchString("stays");
  source.copyTo(target);
  EXPECT_EQ(target.directionsPlan(), source.directionsPlan());
  EXPECT_EQ(target.searchPlacesCount(), 1u);
  EXPECT_EQ(target.searchPlacesAtIndex(0), source.searchPlacesAtIndex(0));
  EXPECT_EQ(target.searchString(), "stays");

  const auto copy = source.copyWithZone();
  EXPECT_TRUE(copy->isEqual(&source));
  EXPECT_EQ(copy->hash(), source.hash());
  copy->directionsPlan()->setOriginString("changed");
  copy->searchPlacesAtIndex(0)->setName("changed");
  EXPECT_EQ(source.directionsPlan()->originString(), "from");
  EXPECT_EQ(source.searchPlacesAtIndex(0)->name(), "1");
}

TEST(ActivityRecord, EqualityTellsEveryKindOfDifference) {
  const std::vector<std::pair<const char*, void (*)(NimboActivity&)>> changes{
      {"a scalar", [](NimboActivity& a) { a.setSelectedPlaceIndex(0); }},
      {"an enumeration", [](NimboActivity& a) { a.setCollectionsMode(0); }},
      {"an empty text", [](NimboActivity& a) { a.setSearchString(""); }},
      {"an empty record", [](NimboActivity& a) { a.setDroppedPin(std::make_shared<DroppedPin>()); }},
      {"an empty array",
       [](NimboActivity& a) {
         a.addSearchPlaces(place("1"));
         a.clearSearchPlaces();
       }},
      {"a nested field", [](NimboActivity& a) {
         a.setDirectionsPlan(std::make_shared<DirectionsPlan>());
         a.directionsPlan()->setCurrentRouteStep(1);
       }}};
  const auto empty = std::make_shared<NimboActivity>();
  for (const auto& [name, change] : changes) {
    NimboActivity changed, again;
    change(changed);
    change(again);
    EXPECT_FALSE(changed.isEqual(empty.get())) << name;
    EXPECT_FALSE(empty->isEqual(&changed)) << name;
    EXPECT_TRUE(changed.isEqual(&again)) << name;
    EXPECT_EQ(changed.hash(), again.hash()) << name;
  }
  EXPECT_FALSE(empty->isEqual(std::make_shared<DirectionsPlan>().get()));
  EXPECT_FALSE(empty->isEqual(nullptr));
}

TEST(ActivityRecord, HashesFollowTheirFormula) {
  DirectionsPlan directions;
  directions.setDisplayMethod(-1);
  EXPECT_EQ(directions.hash(), UINT64_MAX * kHashMultiplier);
  directions.setRoutesPerInitialPage(UINT32_MAX);
  EXPECT_EQ(directions.hash(), (UINT64_MAX * kHashMultiplier) ^ (UINT32_MAX * kHashMultiplier));
  directions.setHasDisplayMethod(false);
  directions.setHasRoutesPerInitialPage(false);
  directions.setArrivalTime(-1.25);
  EXPECT_EQ(directions.hash(), kHashMultiplier + (std::uint64_t{1} << 62));
}

TEST(ActivityRecord, DictionaryHoldsThePresentFieldsByName) {
  NimboActivity activity;
  EXPECT_EQ(activity.dictionaryRepresentation()->description(), "{}");
  activity.setSearchPlaces(std::make_shared<NimboActivity::SearchPlaces>());
  EXPECT_EQ(activity.dictionaryRepresentation()->description(), "{}");
  activity.addSearchPlaces(place("1"));
  activity.setCollectionsMode(2);
  activity.setIsPresentingSelectedPlace(false);
  activity.setSelectedTransitFeatureID(UINT64_MAX);
  activity.setDirectionsPlan(std::make_shared<DirectionsPlan>());
  activity.directionsPlan()->setTransitSurchargeOption(-2);
  activity.directionsPlan()->setTransitPrioritization(9);
  const std::string expected =
      "{collectionsMode = Recents; directionsPlan = {transitPrioritization = (unknown: 9); transitSurchargeOption = "
      "-2}; isPresentingSelectedPlace = NO; searchPlaces = ({name = 1}); selectedTransitFeatureID = "
      "18446744073709551615}";
  EXPECT_EQ(activity.dictionaryRepresentation()->description(), expected);
  EXPECT_EQ(activity.description(), activity.Object::description() + " " + expected);
}

}  // namespace
}  // namespace nimbo
