#include "incidents/DebugTransitIncident.h"
#include "incidents/NBTransitIncidentFetcher.h"
#include "incidents/SharedSettingsStore+Nimbo.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

/// What a fetch delivers for `items` under the settings in force.
TransitLineItems fetched(TestPlatform& platform, const TransitLineItems& items) {
  platform.favorites.setFavorites(Favorites{std::make_shared<const FavoriteTransitLine>(items.at(0))});
  const auto request =
      std::make_shared<NBTransitIncidentFetcher>()->fetchFavoriteLinesTransitIncidentsWithCompletionHandler(nullptr);
  platform.loop.waitAndDrain([&] { return platform.transitLines.pending() == 1; });
  platform.transitLines.answer(items);
  platform.loop.runUntilIdle();
  TransitLineItems delivered;
  request->result()->withValue_orError(
      [&](const ObjectRef& value) {
        delivered = static_cast<const BoxedArray&>(*value).elementsOfClass<TransitLineItem>();
      },
      [](const ErrorRef&) {});
  return delivered;
}

TEST(FakeIncidents, ComeToLinesWithoutIncidentsAsTheNumbersFall) {
  TestPlatform platform;
  const TransitLineItems items{lineItem(10, "with", {incident(1)}), lineItem(20, "kept"), lineItem(30, "faked"),
                               lineItem(40, "faked too")};
  platform.random.numbers = {3, 1, 5};
  EXPECT_EQ(fetched(platform, items), items);
  EXPECT_EQ(platform.random.numbers.size(), 3u) << "random numbers were drawn with the setting off";

  __nimbo_groupUserDefaults()->setValue_forKey(true, kNimboTransitWidgetDebugInjectFakeIncidents);
  TransitLineItems delivered = fetched(platform, items);
  ASSERT_EQ(delivered.size(), 4u);
  EXPECT_EQ(delivered[0], items[0]);
  EXPECT_EQ(delivered[1], items[1]);
  for (const std::size_t faked : {2, 3}) {
    EXPECT_EQ(delivered[faked]->muid(), items[faked]->muid());
    EXPECT_EQ(delivered[faked]->incidents().size(), 1u);
    EXPECT_EQ(delivered[faked]->incidents().front()->muid(), items[faked]->muid() + 1);
  }

  __nimbo_groupUserDefaults()->setValue_forKey(true, kNimboTransitWidgetDebugRandomNumberIncidents);
  platform.random.numbers = {1, 3, 2, 5, 0};  // none for the first, two for the second, the last is kept
  delivered = fetched(platform, items);
  EXPECT_EQ(delivered[1]->incidents().size(), 0u);
  EXPECT_EQ(delivered[2]->incidents().size(), 2u);
  EXPECT_EQ(delivered[3], items[3]);
}

TEST(FakeIncidents, AreStrikesFromYesterdayUntilTomorrow) {
  const TestPlatform platform;
  const Date now = TestPlatform::startDate(), yesterday = dateByAdding(now, -86400),
             tomorrow = dateByAdding(now, 86400);
  const auto fake = DebugTransitIncident::__debug_fakeIncidentAffectingLine(*lineItem(1000, "Red"));
  const std::string message = "Something Bad™ happened";
  EXPECT_THAT(
      std::vector({fake->title(), fake->summary(), fake->fullDescription(), fake->messageForRoutePlanning(),
                   fake->messageForRouteStepping(), fake->messageForNonRoutable()}),
      testing::ElementsAre("Something Bad™", "Red · Possible delays due to strike",
                           "Only one train out of three is working due to national strike of public transit workers.",
                           message, message, message));
  EXPECT_THAT(std::vector({fake->startDate(), fake->endDate(), fake->creationDate(), fake->lastUpdated()}),
              testing::ElementsAre(yesterday, tomorrow, yesterday, now));
  EXPECT_EQ(fake->muid(), 1001u);
  EXPECT_EQ(fake->iconType(), 1);
  EXPECT_TRUE(fake->isBlockingIncident());
  ASSERT_EQ(fake->affectedEntities().size(), 1u);
  EXPECT_EQ(fake->affectedEntities()[0]->muid(), 1000u);
  EXPECT_FALSE(fake->affectedEntities()[0]->hasNextStopIDs());
}

}  // namespace
}  // namespace nimbo
