#include <atomic>
#include <future>
#include <thread>

#include "incidents/DebugTransitIncident.h"
#include "incidents/NBTransitIncidentFetcher.h"
#include "platform/DueAnswer.h"
#include "support/NoThreads.h"
#include "support/TestPlatform.h"

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

TEST_F(Fetcher, LooksUpWhatStandsForFavoritesThatWereNotRead) {
  platform.favorites.setUnread(Favorites{favorite(77)});
  {
    const NoThreads noThreads;
    fetch();
    platform.loop.runUntilIdle();
  }
  EXPECT_THAT(platform.transitLines.lookups(), ElementsAre(ElementsAre(77u)));
  EXPECT_THAT(platform.favorites.unreadReason(), testing::StartsWith("The favorites could not be read: "));

  std::promise<void> proceed;
  platform.favorites.setFavorites(Favorites{favorite(1)}, proceed.get_future());
  fetch();
  platform.loop.runUntilIdle();
  platform.time.advance(DueAnswer::kPatience - 1);
  EXPECT_EQ(platform.transitLines.lookups().size(), 1u);
  platform.time.advance(1);
  EXPECT_THAT(platform.transitLines.lookups(), ElementsAre(ElementsAre(77u), ElementsAre(77u)));
  EXPECT_THAT(platform.favorites.unreadReason(),
              testing::StartsWith("The favorites could not be read within a minute"));
  proceed.set_value();
  fetch();  // comes after the one that was too late
  platform.loop.waitAndDrain([&] { return platform.transitLines.lookups().size() == 3; });
  EXPECT_THAT(platform.transitLines.lookups().back(), ElementsAre(1u));
  platform.loop.runUntilIdle();
  EXPECT_EQ(platform.time.pendingTimers(), 0u);
}

TEST_F(Fetcher, EndsWithAnErrorWhenAStepThrowsAndTellsEveryHandlerAllTheSame) {
  platform.favorites.setFavorites(Favorites{favorite(1)});
  platform.settings.groupStore()->setValue_forKey(true, kNimboTransitWidgetDebugInjectFakeIncidents);
  platform.random.isBroken = true;
  bool isFailure = false;
  const auto request = fetch([](const ResultRef&) { throw std::runtime_error("handler"); });
  request->addHandler([&](const ResultRef& result) {
    result->withValue_orError([](const ObjectRef&) {}, [&](const ErrorRef&) { isFailure = true; });
  });
  waitForLookup();
  platform.transitLines.answer({lineItem(1, "A")});
  platform.loop.waitAndDrain([&] { return request->result() != nullptr; });
  EXPECT_TRUE(isFailure);
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
