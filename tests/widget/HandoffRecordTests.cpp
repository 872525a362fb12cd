#include <gtest/gtest.h>

#include "handoff/NimboActivity.h"
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
}

TEST(ActivityRecord, MergingAddsToWhatIsThere) {
  NimboActivity mine, theirs;
  mine.setDirectionsPlan(plan("from"));
  mine.setSearchString("kept");
  mine.addSearchPlaces(place("1"));
  mine.setIsDroppedPinSelected(true);
  theirs.setDirectionsPlan(std::make_shared<DirectionsPlan>());
  theirs.directionsPlan()->setDepartureTime(1);
  theirs.addSearchPlaces(place("2"));
  theirs.setIsDroppedPinSelected(false);
  theirs.setLineItem(StoredTransitLineItem::initWithLineItem(lineItem(1, "A")));
  const auto minePlan = mine.directionsPlan();
  mine.mergeFrom(theirs);
  EXPECT_EQ(mine.directionsPlan(), minePlan);
  EXPECT_EQ(minePlan->originString(), "from");
  EXPECT_EQ(minePlan->departureTime(), 1);
  EXPECT_EQ(mine.searchString(), "kept");
  EXPECT_EQ(mine.searchPlacesCount(), 2u);
  EXPECT_FALSE(mine.isDroppedPinSelected());
  EXPECT_EQ(mine.lineItem(), theirs.lineItem());

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
}

}  // namespace
}  // namespace nimbo
