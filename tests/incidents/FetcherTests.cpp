#include <gmock/gmock.h>

#include <atomic>

#include "incidents/NBTransitIncidentFetcher.h"
#include "support/TestPlatform.h"
#include "support/TransitFixtures.h"

namespace nimbo {
namespace {

using testing::ElementsAre;

class Fetcher : public testing::Test {
 protected:
  std::shared_ptr<NBTransitIncidentFetcherRequest> fetch(NBTransitIncidentFetcherHandler handler = nullptr) {
    return std::make_shared<NBTransitIncidentFetcher>()->fetchFavoriteLinesTransitIncidentsWithCompletionHandler(
        std::move(handler));
  }
  void waitForLookup() {
    platform.loop.waitAndDrain([this] { return platform.transitLines.pending() == 1; });
  }
  static FavoriteRef favorite(std::uint64_t muid) {
    return std::make_shared<const FavoriteTransitLine>(lineItem(muid, "line"));
  }

  TestPlatform platform;
};

TEST_F(Fetcher, SucceedsWithNothingWithoutFavoriteLines) {
  const std::optional<Favorites> cases[] = {
      std::nullopt, Favorites{},
      Favorites{std::make_shared<const OtherFavorite>("place"), std::make_shared<const FavoriteTransitLine>(nullptr)}};
  for (const auto& favorites : cases) {
    platform.favorites.setFavorites(favorites);
    bool onMainThread = false;
    const auto request = fetch([&](const ResultRef&) { onMainThread = platform.loop.isCurrent(); });
    EXPECT_EQ(request->result(), nullptr);
    platform.loop.waitAndDrain([&] { return request->result() != nullptr; });
    EXPECT_TRUE(onMainThread);
    EXPECT_TRUE(request->result()->isEqual(Result::resultWithValue(BoxedArray::of<Object>({})).get()));
  }
  EXPECT_TRUE(platform.transitLines.lookups().empty());
}

TEST_F(Fetcher, LooksAllLinesUpAtOnceAndTellsEveryHandlerInOrder) {
  platform.favorites.setFavorites(
      Favorites{favorite(30), std::make_shared<const OtherFavorite>("place"), favorite(10), favorite(20)});
  std::vector<std::pair<int, ResultRef>> heard;
  std::shared_ptr<NBTransitIncidentFetcherRequest> request;
  const auto hear = [&](int who) {
    return [&, who](const ResultRef& result) {
      heard.emplace_back(who, result);
      EXPECT_EQ(request->result(), result);  // may be asked meanwhile
    };
  };
  request = fetch([&](const ResultRef& result) {
    hear(1)(result);
    request->addHandler(hear(2));  // delivered already: called at once
  });
  request->addHandler(hear(3));
  request->addHandler(nullptr);
  waitForLookup();
  EXPECT_THAT(platform.transitLines.lookups(), ElementsAre(ElementsAre(30u, 10u, 20u)));
  EXPECT_TRUE(heard.empty());

  const TransitLineItems items{lineItem(10, "A"), lineItem(30, "B")};
  platform.transitLines.answer(items);
  platform.loop.runUntilIdle();
  const ResultRef result = request->result();
  ASSERT_TRUE(result);
  EXPECT_TRUE(result->isEqual(Result::resultWithValue(BoxedArray::of(items)).get()));
  request->addHandler(hear(4));
  using Heard = std::pair<int, ResultRef>;
  EXPECT_THAT(heard, ElementsAre(Heard{1, result}, Heard{2, result}, Heard{3, result}, Heard{4, result}));
  EXPECT_THAT(
      platform.log.texts("TransitWidget", LogLevel::debug),
      ElementsAre("Received 4 favorites from container.",
                  testing::StartsWith("Issuing favorite lines lookup request for Muids"), "Received 2 line items."));
}

TEST_F(Fetcher, DeliversTheErrorOfTheServiceAsItCame) {
  platform.favorites.setFavorites(Favorites{favorite(123456)});
  const auto request = fetch();
  waitForLookup();
  const ErrorRef error = Error::errorWithDomain_code_reason("Service", 9, "no answer");
  platform.transitLines.answer({lineItem(1, "ignored")}, error);
  platform.loop.runUntilIdle();
  ErrorRef delivered;
  request->result()->withValue_orError([](const ObjectRef&) {}, [&](const ErrorRef& e) { delivered = e; });
  EXPECT_EQ(delivered, error);
  for (const auto& line : platform.log.lines())
    EXPECT_EQ(line.redacted.find("123456"), std::string::npos) << "not private: " << line.redacted;
  EXPECT_TRUE(platform.log.contains("123456"));
}

TEST(FetcherRequest, LosesNoHandlerThatComesWhileItDelivers) {
  constexpr int kHandlers = 2000;
  const auto request = _NBTransitIncidentFetcherRequest::initWithCompletionHandler(nullptr);
  EXPECT_TRUE(request->handlers().empty());
  std::atomic<int> heard = 0;
  std::thread adding([&] {
    for (int i = 0; i < kHandlers; ++i) request->addHandler([&](const ResultRef&) { ++heard; });
  });
  request->setResultAndInvokeCompletionHandlers(Result::resultWithValue(box(1)));
  adding.join();
  EXPECT_EQ(heard, kHandlers);
}

}  // namespace
}  // namespace nimbo
