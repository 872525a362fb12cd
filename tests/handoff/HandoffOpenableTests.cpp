#include "handoff/ApplicationRecord+NimboExtras.h"
#include "handoff/NBOpenable.h"
#include "handoff/NBUserActivityData.h"
#include "platform/UserSession.h"
#include "support/TestPlatform.h"
#include "support/WidgetHostDouble.h"

namespace nimbo {
namespace {

class Openable : public testing::Test {
 protected:
  NBOpenable::Completion record() {
    return [this](bool opened, const ErrorRef& error) { answers.emplace_back(opened, error); };
  }

  static NBUserActivityDataRef data(std::optional<std::string> type, BoxedDictionary::Entries entries = {}) {
    return NBUserActivityData::initWithActivityType_userInfo(
        std::move(type), std::make_shared<const BoxedDictionary>(std::move(entries)));
  }

  TestPlatform platform;
  std::vector<std::pair<bool, ErrorRef>> answers;  // opened, or why not
};

TEST_F(Openable, ActivityDataIsTaggedWhenMadeAndComparedByWhatItStores) {
  platform.random.numbers = {1, 2, 3, 4, 5, 6, 7, 8};
  const auto a = data("type", {{"key", box(1)}});
  const std::string session = "00000001000000020000000300000004";
  EXPECT_TRUE(a->userInfo()->objectForKey(kUserSessionTag)->isEqual(box(session).get()));
  EXPECT_EQ(platform.settings.groupStore()->stringForKey(kUserSessionIdentifierKey), session);
  const struct {
    ObjectRef other;
    bool equal;
  } cases[] = {{data("type", {{"key", box(1)}}), true},
               {data("type", {{"key", box(2)}}), false},
               {data("other", {{"key", box(1)}}), false},
               {data(std::nullopt, {{"key", box(1)}}), false}};
  for (const auto& test : cases) {
    EXPECT_EQ(a->isEqual(test.other.get()), test.equal);
    EXPECT_TRUE(!test.equal || a->hash() == test.other->hash());
  }
}

TEST_F(Openable, PayloadsAreMadeAgainForEveryOtherListAndKeptForTheSame) {
  auto a = incident(1);
  const auto b = incident(2);
  const auto payloadOf = [](const TransitIncidents& incidents) {
    return activityDataForIncidents(incidents)->userInfo()->objectForKey("incidentListKey");
  };
  const std::weak_ptr<const Object> payload = payloadOf({a});
  EXPECT_EQ(payloadOf({a}), payload.lock());
  for (const TransitIncidents& other : {TransitIncidents{a, b}, {b, a}, {b}, {}})
    EXPECT_FALSE(payloadOf(other)->isEqual(payload.lock().get()));
  a.reset();
  payloadOf({b, b});
  EXPECT_TRUE(payload.expired()) << "that of an incident that is gone";
  platform.archive.fails = platform.compressor.fails = true;
  EXPECT_EQ(activityDataForIncidents({b, b, b}), nullptr);
  EXPECT_EQ(activityDataForLineItem(lineItem(1, "A")), nullptr);
}

TEST_F(Openable, AnActivityGoesToTheApplicationThatContainsTheProgram) {
  const auto application = std::make_shared<const ApplicationRecord>("map");
  const auto other = std::make_shared<const BundleRecord>("other");
  const struct {
    BundleRecordRef process;
    ApplicationRecordRef expected;
  } cases[] = {{application, application},
               {std::make_shared<const ExtensionRecord>("widget", application), application},
               {std::make_shared<const ExtensionRecord>("widget", other), nullptr},
               {other, nullptr}};
  const auto activity = data("type", {{"key", box(1)}});
  for (const auto& test : cases) {
    platform.activityLauncher.bundleRecord = test.process;
    activity->openInContext_completionHandler(nullptr, record());
    platform.loop.runUntilIdle();
    const auto& opened = platform.activityLauncher.opened.back();
    EXPECT_EQ(opened.application, test.expected);
    EXPECT_EQ(opened.activity->activityType(), "type");
    EXPECT_EQ(opened.activity->userInfo(), activity->userInfo());
    EXPECT_TRUE(opened.requireUnlockPrompt);
  }
  EXPECT_EQ(answers.size(), std::size(cases));
}

TEST_F(Openable, AnActivityThatCannotBeOpenedSaysWhy) {
  const auto activity = data("type");
  activity->openInContext_completionHandler(nullptr, record());  // no bundle record
  platform.activityLauncher.refusesToCreate = true;
  activity->openInContext_completionHandler(nullptr, record());
  ASSERT_EQ(answers.size(), 2u);
  EXPECT_FALSE(answers[0].first);
  EXPECT_EQ(answers[0].second->domain(), "NimboActivityErrorDomain");
  EXPECT_TRUE(answers[0]
                  .second->userInfo()
                  ->objectForKey(kErrorDebugDescriptionKey)
                  ->isEqual(box("no appliction proxy object for current process").get()));
  EXPECT_FALSE(answers[1].first);
  EXPECT_EQ(answers[1].second->domain(), "NBUserActivityErrorDomain");
  EXPECT_EQ(answers[1].second->userInfo()->objectForKey("NBUserActivityErrorMissingActivityKey"), activity);
  activity->openInContext_completionHandler(nullptr, nullptr);
  EXPECT_TRUE(platform.activityLauncher.opened.empty());
}

TEST_F(Openable, AURLOpensThroughTheHostOfAViewController) {
  platform.random.numbers = {1, 2, 3, 4, 5, 6, 7, 8};
  WidgetHostDouble host;
  const auto controller = std::make_shared<ViewControllerDouble>(&host);
  const NBURLOpenable openable(URL("nimbo://?t=r"));
  const auto noController = std::make_shared<BoxedString>("context");
  openable.openInContext_completionHandler(noController.get(), record());
  openable.openInContext_completionHandler(nullptr, record());
  EXPECT_TRUE(host.openedURLs.empty());

  openable.openInContext_completionHandler(controller.get(), record());
  host.opens = false;
  openable.openInContext_completionHandler(controller.get(), record());
  ASSERT_EQ(host.openedURLs.size(), 2u);
  const auto session = platform.settings.groupStore()->stringForKey(kUserSessionIdentifierKey);
  for (const URL& url : host.openedURLs)
    EXPECT_EQ(url.absoluteString(), "nimbo://?t=r&session=" + session.value_or("?"));
  ASSERT_EQ(answers.size(), 2u);
  EXPECT_TRUE(answers[0].first);
  EXPECT_FALSE(answers[1].first);
  EXPECT_TRUE(openable.isEqual(std::make_shared<NBURLOpenable>(URL("nimbo://?t=r")).get()));
  EXPECT_FALSE(openable.isEqual(std::make_shared<NBURLOpenable>(URL("nimbo://")).get()));
}

}  // namespace
}  // namespace nimbo
