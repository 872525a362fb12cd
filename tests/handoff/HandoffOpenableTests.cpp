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

/// The record without its field of this number.
template <class Record>
std::shared_ptr<const Record> without(const Record& record, std::uint64_t number) {
  const Bytes bytes = record.data();
  Bytes kept;
  for (ProtobufReader reader(bytes); reader.position() < reader.length();) {
    const auto begin = static_cast<std::ptrdiff_t>(reader.position());
    const std::uint64_t tag = reader.readVarint();
    reader.skipValueWithTag(static_cast<std::uint32_t>(tag >> 3), static_cast<std::uint32_t>(tag & 7));
    const auto end = static_cast<std::ptrdiff_t>(reader.position());
    if (tag >> 3 != number) kept.insert(kept.end(), bytes.begin() + begin, bytes.begin() + end);
  }
  auto result = std::make_shared<Record>();
  ProtobufReader reader(kept);
  EXPECT_TRUE(result->readFrom(reader));
  return result;
}

TEST_F(Openable, PayloadsAreEqualWhereTheirRecordsAre) {
  const Date date(std::chrono::hours(1));
  const TransitIncidentAffectedEntities affected{std::make_shared<const BasicAffectedEntity>(1)};
  const TransitIncidentFields texts{1, "1", "2", "3", "4", "5", "6", date, date, date, date, 1, true, affected, "7"};
  const auto whole = std::make_shared<const StoredTransitIncident>(texts);
  const auto identifier = std::make_shared<const MapItemIdentifier>(1, TransitLineLocator{"feed"});
  const auto system = std::make_shared<const TransitSystem>(1, "System", nullptr);
  const auto art = shieldArtwork("A");
  const Scalar<bool> no{false, true};
  const TransitIncidents incidents{whole};
  const StoredTransitLineItemFields fields{identifier, "A",  system, art,  art,  art, "#c8102e", true,
                                           1,          true, true,   true, true, no,  incidents};
  const auto line = std::make_shared<const StoredTransitLineItem>(fields);
  const auto list = activityDataForIncidents({whole, incident(2)}), data = activityDataForLineItem(line);
  for (std::uint64_t field = 0; field <= 15; ++field) {  // 0: all are there
    const auto otherList = activityDataForIncidents({without(*whole, field), incident(2)});
    const auto otherData = activityDataForLineItem(without(*line, field));
    EXPECT_EQ(otherList->isEqual(list.get()), field == 0) << field;
    EXPECT_EQ(otherData->isEqual(data.get()), field == 0) << field;
    EXPECT_TRUE(field > 0 || (otherList->hash() == list->hash() && otherData->hash() == data->hash()));
  }
  for (const TransitIncidents& other : {TransitIncidents{whole}, {incident(2), whole}, {}})
    EXPECT_FALSE(activityDataForIncidents(other)->isEqual(list.get()));
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
