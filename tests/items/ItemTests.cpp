#include "handoff/NBOpenable.h"
#include "items/NBTransitIncidentDataSourceErrorBuilder.h"
#include "items/NBTransitIncidentFilter.h"
#include "items/NBTransitItemDataSourceBuilder.h"
#include "items/NBTransitListItem.h"
#include "items/NBTransitSummaryItem.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/artwork/ArtworkImageSource.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

/// Checks that each of the objects is equal to its own second making, with an equal hash, and to no other's.
void expectEachEqualOnlyToItself(const std::function<std::vector<ObjectRef>()>& make) {
  const auto first = make(), second = make();
  for (std::size_t i = 0; i < first.size(); ++i)
    for (std::size_t j = 0; j < first.size(); ++j) {
      EXPECT_EQ(first[i]->isEqual(second[j].get()), i == j) << i << " " << j;
      EXPECT_TRUE(i != j || first[i]->hash() == second[j]->hash()) << i;
    }
}

template <class... Refs>
std::vector<ObjectRef> objects(Refs... refs) {
  return {std::move(refs)...};
}

NBConfiguredArtworkRef artworkNamed(const char* name, double alpha = kFullArtworkAlpha) {
  return NBConfiguredArtwork::initWithArtworkSource_alpha(NamedImage::imageNamed(name), alpha);
}

NBTransitItemRef item(std::optional<std::string> primary, std::optional<std::string> secondary = {},
                      NBConfiguredArtworkRef artwork = nullptr, bool hidden = false, const char* url = nullptr) {
  return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      std::move(primary), std::move(secondary), std::move(artwork), hidden,
      url ? std::make_shared<const NBURLOpenable>(URL(url)) : nullptr);
}

TEST(ConfiguredArtwork, IsEqualByAlphaAndByWhatTheSourceArchivesTo) {
  const TestPlatform platform;
  const auto sized = [](const char* text, int size) {
    return NBConfiguredArtwork::initWithArtworkSource_alpha(
        SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(shieldArtwork(text), size, nullptr), 1.0);
  };
  expectEachEqualOnlyToItself([&] {
    return objects(artworkNamed("good"), artworkNamed("bad"), artworkNamed("good", kDimmedArtworkAlpha),
                   NBConfiguredArtwork::initWithArtworkSource_alpha(nullptr, 1.0), sized("A", 7), sized("A", 6),
                   sized("B", 7));
  });
}

TEST(TransitItem, CopiesItselfAndIsNoEqualOfADerivedItem) {
  const TestPlatform platform;
  const auto original = item("a", "b", artworkNamed("good", kDimmedArtworkAlpha), true, "nimbo://1");
  const auto copy = original->copyWithZone();
  EXPECT_TRUE(copy != original && copy->isEqual(original.get()) && copy->hash() == original->hash());
  struct Derived final : NBTransitItem {
    using NBTransitItem::NBTransitItem;
  };
  const Derived derived("a", "b", original->artwork(), true, original->openable());
  EXPECT_FALSE(original->isEqual(&derived));
  EXPECT_EQ(original->hash() ^ Derived("a", "b", original->artwork(), false, original->openable()).hash(), 2654435761u);
}

TEST(TransitItem, IsEqualFieldByField) {
  const TestPlatform platform;
  expectEachEqualOnlyToItself([&] {
    return objects(item("a"), item(std::nullopt), item(""), item("a", "b"),
                   item("a", std::nullopt, artworkNamed("good")), item("a", std::nullopt, nullptr, true),
                   item("a", std::nullopt, nullptr, false, "nimbo://1"),
                   item("a", std::nullopt, nullptr, false, "nimbo://2"));
  });
}

TEST(SummaryItem, IsEqualByTextShieldsInOrderAndActivity) {
  const TestPlatform platform;
  const auto summary = [](const char* text, const std::vector<TransitArtworkRef>& shields, const char* activity) {
    return NBTransitSummaryItem::initWithText_artworks_userActivityData(
        text, shields, activity ? NBUserActivityData::initWithActivityType_userInfo(activity, nullptr) : nullptr);
  };
  const auto accessible = [](const char* text) {
    auto fields = shieldArtwork("A")->fields();
    fields.accessibilityText = text;
    return std::make_shared<const TransitArtwork>(std::move(fields));
  };
  expectEachEqualOnlyToItself([&] {
    return objects(summary("2", {shieldArtwork("A"), shieldArtwork("B")}, nullptr),
                   summary("2", {shieldArtwork("B"), shieldArtwork("A")}, nullptr),
                   summary("2", {shieldArtwork("A")}, nullptr), summary("2", {accessible("Line A")}, nullptr),
                   summary("3", {shieldArtwork("A")}, nullptr), summary("3", {shieldArtwork("A")}, "type"));
  });
}

TEST(ListItem, IsEqualByItsRows) {
  const auto list = [](ObjectRef summary, std::optional<NBTransitItems> items) {
    return NBTransitListItem::initWithSummaryItem_expandedItems(std::move(summary), std::move(items));
  };
  expectEachEqualOnlyToItself([&] {
    return objects(list(item("a"), NBTransitItems{}), list(item("b"), NBTransitItems{}), list(item("a"), std::nullopt),
                   list(item("a"), NBTransitItems{item("x"), item("y")}),
                   list(item("a"), NBTransitItems{item("y"), item("x")}));
  });
}

TEST(IncidentFilter, ShowsWhatIsInForceNow) {
  const TestPlatform platform;
  const auto at = [](int seconds) { return std::optional(dateByAdding(TestPlatform::startDate(), seconds)); };
  const struct {
    std::optional<Date> start, end;
    bool shown;
  } cases[] = {{{}, {}, true},        {at(-1), {}, true},   {at(0), {}, true},   {at(1), {}, false},
               {{}, at(1), true},     {{}, at(0), true},    {{}, at(-1), false}, {at(-2), at(-1), false},
               {at(-1), at(1), true}, {at(1), at(2), false}};
  for (const auto& [start, end, shown] : cases)
    EXPECT_EQ(NBTransitIncidentFilter().shouldDisplayIncident(*incident(1, start, end)), shown)
        << (start ? isoTextOfDate(*start) : "ever") << " to " << (end ? isoTextOfDate(*end) : "ever");
}

TEST(ErrorBuilder, NamesTheNetworkConditionWhateverTheErrorSays) {
  TestPlatform platform;
  const std::pair<int, std::optional<std::string>> cases[] = {
      {0, "TransitWidgetLoadingError_Unknown"},          {1, "TransitWidgetLoadingError_AirplaneMode"},
      {2, "TransitWidgetLoadingError_CellDataDisabled"}, {3, "TransitWidgetLoadingError_No_Internet"},
      {4, "TransitWidgetLoadingError_Unknown"},          {5, std::nullopt}};
  for (const auto& [code, text] : cases) {
    platform.network.failure = static_cast<NetworkFailure>(code);
    const auto builder = NBTransitDataSourceBuilderForResult(
        Result::resultWithError(Error::errorWithDomain_code_reason("d", 1, "r")), 4, nullptr, nullptr);
    const NBTransitListItemRef list = builder->listItem();
    EXPECT_TRUE(list->summaryItem()->isEqual(item("TransitWidgetLoadingError_Title", text, nullptr, true).get()))
        << list->summaryItem()->description();
    EXPECT_TRUE(list->expandedItems() && list->expandedItems()->empty());
    EXPECT_EQ(builder->listItem(), list);
  }
}

}  // namespace
}  // namespace nimbo
