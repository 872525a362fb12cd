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

TEST_F(Openable, PayloadsAreEqualWhereTheirRecordsAre) {
  const auto a = incident(1), b = incident(2);
  const auto list = activityDataForIncidents({a, b}), line = activityDataForLineItem(lineItem(1, "A", {a}));
  const std::pair<NBUserActivityDataRef, const Object*> equal[] = {
      {activityDataForIncidents({incident(1), b}), list.get()},
      {activityDataForLineItem(lineItem(1, "A", {incident(1)})), line.get()}};
  for (const auto& [made, other] : equal) {
    EXPECT_TRUE(made->isEqual(other));
    EXPECT_EQ(made->hash(), other->hash());
  }
  for (const TransitIncidents& other : {TransitIncidents{a}, {b, a}, {a, incident(3)}, {}})
    EXPECT_FALSE(activityDataForIncidents(other)->isEqual(list.get()));
  for (const TransitLineItemRef& other : {lineItem(1, "B", {a}), lineItem(1, "A", {b}), lineItem(1, "A")})
    EXPECT_FALSE(activityDataForLineItem(other)->isEqual(line.get()));
}

TEST_F(Openable, PayloadsAreMadeWhenTheyAreOpened) {
  platform.activityLauncher.bundleRecord = std::make_shared<const ApplicationRecord>("map");
  platform.compressor.fails = platform.archive.fails = true;
  const auto line = activityDataForLineItem(lineItem(1, "A")), list = activityDataForIncidents({incident(1)});
  for (const auto& activity : {line, list}) activity->openInContext_completionHandler(nullptr, record());
  ASSERT_EQ(answers.size(), 2u);
  for (const auto& [opened, error] : answers) EXPECT_TRUE(!opened && error->code() == 1);
  EXPECT_TRUE(platform.log.contains("cannot be made: bs") && platform.log.contains("cannot be made: incidentListKey"));
  EXPECT_TRUE(platform.activityLauncher.opened.empty());
  platform.compressor.fails = platform.archive.fails = false;
  for (const auto& [activity, key] : {std::pair(line, "bs"), {list, "incidentListKey"}}) {
    activity->openInContext_completionHandler(nullptr, record());
    const auto opened = platform.activityLauncher.opened.back().activity->userInfo();
    EXPECT_TRUE(std::dynamic_pointer_cast<const BoxedData>(opened->objectForKey(key))) << key;
    EXPECT_TRUE(opened->objectForKey(kUserSessionTag)) << key;
  }
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
    EXPECT_TRUE(opened.activity->userInfo()->isEqual(activity->userInfo().get()));
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
