#include <functional>

#include "handoff/ApplicationRecord+NimboExtras.h"
#include "handoff/NBOpenable.h"
#include "handoff/NBUserActivityData.h"
#include "platform/UserSession.h"
#include "platform/wire/StoredTransitIncident.h"
#include "platform/wire/StoredTransitLineItem.h"
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

using LineFields = StoredTransitLineItemFields;
using IncidentFields = TransitIncidentFields;

/// One for each field.
const std::function<void(LineFields&)> kLineChanges[] = {
    [](auto& f) { f.identifier = std::make_shared<const MapItemIdentifier>(1, TransitLineLocator{"feed"}); },
    [](auto& f) { f.name = "B"; },
    [](auto& f) { f.system = std::make_shared<const TransitSystem>(1, "System", nullptr); },
    [](auto& f) { f.artwork = shieldArtwork("B"); },
    [](auto& f) { f.modeArtwork = shieldArtwork("B"); },
    [](auto& f) { f.alternateArtwork = shieldArtwork("B"); },
    [](auto& f) { f.lineColorString = "#c8102e"; },
    [](auto& f) { f.isBus = true; },
    [](auto& f) { f.departureTimeDisplayStyle = 1; },
    [](auto& f) { f.departuresAreVehicleSpecific = true; },
    [](auto& f) { f.showVehicleNumber = true; },
    [](auto& f) { f.hasEncyclopedicInfo = true; },
    [](auto& f) { f.isIncidentsTTLExpired = true; },
    [](auto& f) { f.hasIncidentComponent.set(false); },
    [](auto& f) { f.incidents = {StoredTransitIncident::initWithIncident(incident(1))}; }};
const std::function<void(IncidentFields&)> kIncidentChanges[] = {
    [](auto& f) { f.muid = 2; },
    [](auto& f) { f.title = ""; },
    [](auto& f) { f.summary = "other"; },
    [](auto& f) { f.fullDescription = "other"; },
    [](auto& f) { f.messageForRoutePlanning = "other"; },
    [](auto& f) { f.messageForRouteStepping = "other"; },
    [](auto& f) { f.messageForNonRoutable = "other"; },
    [](auto& f) { f.startDate = Date(); },
    [](auto& f) { f.endDate = Date(); },
    [](auto& f) { f.creationDate = Date(); },
    [](auto& f) { f.lastUpdated = Date(); },
    [](auto& f) { f.iconType = 1; },
    [](auto& f) { f.isBlockingIncident = true; },
    [](auto& f) { f.affectedEntities = {std::make_shared<const BasicAffectedEntity>(1)}; },
    [](auto& f) { f.linkURL = "https://example.org"; }};

TEST_F(Openable, PayloadsAreEqualWhereTheirRecordsAre) {
  const auto line = [](const std::function<void(LineFields&)>& change) {
    LineFields fields{.identifier = std::make_shared<const MapItemIdentifier>(1), .artwork = shieldArtwork("A")};
    if (change) change(fields);
    return activityDataForLineItem(std::make_shared<const StoredTransitLineItem>(std::move(fields)));
  };
  const auto list = [](const std::function<void(IncidentFields&)>& change) {
    IncidentFields fields{.muid = 1};
    if (change) change(fields);
    return activityDataForIncidents({std::make_shared<const BasicTransitIncident>(std::move(fields)), incident(3)});
  };
  const auto expectEqual = [](const NBUserActivityDataRef& a, const NBUserActivityDataRef& b) {
    EXPECT_TRUE(a->isEqual(b.get()));
    EXPECT_EQ(a->hash(), b->hash());
  };
  expectEqual(line(nullptr), line(nullptr));
  expectEqual(list(nullptr), list(nullptr));
  expectEqual(line(kLineChanges[14]), line(kLineChanges[14]));
  for (const auto& change : kLineChanges) EXPECT_FALSE(line(change)->isEqual(line(nullptr).get()));
  for (const auto& change : kIncidentChanges) EXPECT_FALSE(list(change)->isEqual(list(nullptr).get()));
  for (const TransitIncidents& other : {TransitIncidents{incident(3)}, {}})
    EXPECT_FALSE(activityDataForIncidents(other)->isEqual(list(nullptr).get()));
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
