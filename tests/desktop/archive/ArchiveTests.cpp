// Keyed archives and saved states, their bytes read and written by a plain CBOR library too.

#include <cmath>
#include <limits>
#include <nlohmann/json.hpp>

#include "desktop/archive/Bzip2.h"
#include "desktop/archive/CBORKeyedArchive.h"
#include "handoff/NBUserActivityData.h"
#include "platform/wire/StoredTransitIncident.h"
#include "platform/wire/StoredTransitLineItem.h"
#include "support/TestPlatform.h"
#include "widget/NBTransitIncidentsViewController.h"

namespace nimbo {
namespace {

using nlohmann::json;
using State = NBTransitIncidentViewControllerState;

const AllowedClasses kPlainClasses{&kStringClass, &kNumberClass,     &kDataClass, &kDateClass,
                                   &kArrayClass,  &kDictionaryClass, &kErrorClass};

ObjectRef dictionary(BoxedDictionary::Entries entries) {
  return std::make_shared<const BoxedDictionary>(std::move(entries));
}

ObjectRef array(std::vector<ObjectRef> elements) { return std::make_shared<const BoxedArray>(std::move(elements)); }

class Archive : public testing::Test {
 protected:
  Bytes archived(const ObjectRef& root) {
    const auto result = archive.archivedDataWithRootObject(root, true);
    EXPECT_TRUE(result) << result.error()->reason();
    return result ? *result : Bytes();
  }

  KeyedUnarchiver::Decoded decoded(const Bytes& bytes, const AllowedClasses& classes) {
    const auto unarchiver = archive.unarchiverForReadingFromData(bytes);
    if (!unarchiver) return {};
    unarchiver->setDecodingFailurePolicy(DecodingFailurePolicy::setErrorAndReturn);
    return unarchiver->decodeTopLevelObjectOfClasses_forKey(classes, kKeyedArchiveRootObjectKey);
  }

  CBORKeyedArchive archive;
  Bzip2Compressor compressor;
  TestPlatform platform{&archive, &compressor};
};

Bytes archiveOf(const json& root) { return json::to_cbor({{"$archive", 1}, {"root", root}}); }

TEST_F(Archive, PlainValuesComeBackEqualAndGiveTheSameBytesAgain) {
  const ObjectRef inner = Error::errorWithDomain_code_reason("Inner", 3, "why");
  const ObjectRef root =
      dictionary({{"", box("")},
                  {"$class", box("a key like the archive's own")},
                  {"text", box(std::string("\0 \xf0\x9f\x9a\x87", 6))},
                  {"numbers", array({box(true), box(INT64_MIN), box(UINT64_MAX), box(-0.1), box(5e-324), box(1.5)})},
                  {"bytes", box(Bytes{0, 255, 10})},
                  {"dates", array({box(Date::min()), box(Date::max()), box(Date{})})},
                  {"empty", array({array({}), dictionary({})})},
                  {"error", Error::errorWithDomain_code_userInfo("Outer", INT64_MIN, {{"underlying", inner}})}});
  const Bytes bytes = archived(root);
  const auto [object, error] = decoded(bytes, kPlainClasses);
  ASSERT_FALSE(error) << error->reason();
  EXPECT_TRUE(root->isEqual(object.get())) << object->description();
  EXPECT_EQ(archived(object), bytes);

  const auto infinite = decoded(archived(array({box(std::nan("")), box(HUGE_VAL)})), kPlainClasses).object;
  EXPECT_EQ(infinite->description(), "(nan, inf)");
}

TEST_F(Archive, AnyReaderOfCBORFindsVersionClassNamesAndKeys) {
  const auto state = State::initWithLineItemsResult_expanded(
      Result::resultWithValue(BoxedArray::of<TransitLineItem>({lineItem(1, "A")})), true);
  const json content = json::from_cbor(archived(state));
  EXPECT_EQ(content["$archive"], 1);
  const json& root = content["root"];
  EXPECT_EQ(root["$class"], "NBTransitIncidentViewControllerState");
  EXPECT_EQ(root["expanded"], true);
  EXPECT_EQ(root["lineItemResultSuccess"][0]["$class"], "StoredTransitLineItem");
  EXPECT_EQ(Bytes(root["lineItemResultSuccess"][0]["record"].get_binary()),
            StoredTransitLineItem::initWithLineItem(lineItem(1, "A"))->data());
}

TEST_F(Archive, WhatMayNotStandInAnArchiveFailsWithItsPlace) {
  ObjectRef deep = box("bottom");
  for (int i = 0; i < 1000; ++i) deep = array({deep});
  const auto activity = NBUserActivityData::initWithActivityType_userInfo("type", nullptr);
  const std::pair<ObjectRef, const char*> cases[] = {
      {array({box("a"), activity}), "root[1]: an object of the class NBUserActivityData cannot be archived"},
      {Error::errorWithDomain_code_userInfo("D", 0, {{"x", NamedImage::imageNamed("i")}}),
       "root.userInfo.x: an object of the class NamedImage cannot be archived"},
      {box("\xff"), "root: a text is not UTF-8"},
      {deep, "nested too deep"},
      {box(Bytes(std::size_t{17} << 20)), "more than 16777216"},
      {nullptr, "root: an object of the class (null) cannot be archived"},
  };
  for (const auto& [root, reason] : cases) {
    const auto archived = archive.archivedDataWithRootObject(root, true);
    ASSERT_FALSE(archived) << reason;
    EXPECT_THAT(archived.error()->reason(), testing::HasSubstr(reason));
  }
}

/// A line item in which no field is absent or 0, with an incident as a service gives it or as a snapshot keeps it.
template <class Incident>
std::shared_ptr<const StoredTransitLineItem> wholeLineItem() {
  const Date first = *dateFromISOText("0001-01-01T00:00:00Z"), last = *dateFromISOText("9999-12-31T23:59:59.999999Z");
  TransitIncidentFields incident{UINT64_MAX, "Title",       "", "Full\nof signs: \xe2\x80\xae \xff", "planning",
                                 "stepping", "not routable"};
  incident.startDate = incident.lastUpdated = first;
  incident.endDate = incident.creationDate = last;
  incident.iconType = -5;
  incident.isBlockingIncident = true;
  incident.affectedEntities = {std::make_shared<BasicAffectedEntity>(9)};
  incident.linkURL = "https://example.org/1";
  StoredTransitLineItemFields fields{
      std::make_shared<const MapItemIdentifier>(42,
                                                TransitLineLocator{"feed", "", "route", "S", TransitMode::monorail}),
      "S",
      std::make_shared<const TransitSystem>(3, "Network", modeArtwork(TransitMode::rail)),
      shieldArtwork("Line S"),
      modeArtwork(TransitMode::monorail),
      shieldArtwork("S"),
      "#123456"};
  fields.isBus = fields.departuresAreVehicleSpecific = fields.showVehicleNumber = true;
  fields.hasEncyclopedicInfo = fields.isIncidentsTTLExpired = true;
  fields.departureTimeDisplayStyle = 1;
  fields.hasIncidentComponent.set(false);
  fields.incidents = {std::make_shared<const Incident>(incident), std::make_shared<const Incident>(incident)};
  return std::make_shared<const StoredTransitLineItem>(std::move(fields));
}

TEST_F(Archive, RestoredLineItemsAnswerLikeTheFetchedOnes) {
  const TransitLineItemRef whole = wholeLineItem<BasicTransitIncident>(), bare = lineItem(2, "B");
  const auto state = State::unarchiveFromData_error(
      archived(State::initWithLineItemsResult_expanded(
          Result::resultWithValue(BoxedArray::of<TransitLineItem>({whole, bare})), true)),
      nullptr);
  ASSERT_TRUE(state);
  const BoxedArray expected({wholeLineItem<StoredTransitIncident>(), StoredTransitLineItem::initWithLineItem(bare)});
  state->lineItemsResult()->withValue_orError(
      [&](const ObjectRef& value) { EXPECT_TRUE(value->isEqual(&expected)) << value->description(); },
      [](const ErrorRef& error) { FAIL() << error->reason(); });
}

TEST_F(Archive, TheEarlierClassNameIsReadAsAState) {
  const auto state = State::unarchiveFromData_error(
      archiveOf({{"$class", "NBTransitListItemData"}, {"lineItemResultSuccess", json::array()}, {"expanded", true}}),
      nullptr);
  EXPECT_TRUE(state && state->expanded());
}

TEST_F(Archive, BrokenStatesEndInNothingAndOnlyUndecodableOnesInAnError) {
  const json line{{"$class", "StoredTransitLineItem"}, {"record", json::binary({})}};
  const auto state = [](json fields) {
    fields.emplace("$class", "NBTransitIncidentViewControllerState");
    return archiveOf(fields);
  };
  const auto raw = [](const std::string& bytes) { return Bytes(bytes.begin(), bytes.end()); };
  const std::string root = "\xa2\x68$archive\x01\x64root", most(8, '\xff');  // a map of two, up to the root
  json deep = 1;
  for (int i = 0; i < 1000; ++i) deep = json::array({deep});
  Bytes withRest = state({{"lineItemResultSuccess", json::array()}});
  withRest.push_back(0);
  // With a part of the decoding error; empty: nothing, and no error.
  const std::pair<Bytes, std::string> cases[] = {
      // Bytes that are no archive.
      {{}, ""},
      {json::to_cbor({{"$archive", 2}, {"root", 1}}), ""},
      {archiveOf(deep), ""},
      {withRest, ""},
      {Bytes(std::size_t{100} << 20), ""},
      {raw(root + "\x9b" + most), ""},                      // an array of 2^64 - 1
      {raw(root + "\x7b" + most + "."), ""},                // as long a text
      {raw("\xa3\x68$archive\x01\x61x\x01\x61x\x02"), ""},  // a key twice
      {raw(root + "\xc1" + '\0'), ""},                      // a tag
      {archiveOf(std::vector<int>(300000)), ""},            // too many values
      // Archives without a state, or with one that holds no result.
      {json::to_cbor({{"$archive", 1}}), ""},
      {state({{"expanded", true}}), ""},
      {state({{"lineItemResultSuccess", line}}), ""},
      // Archives that hold what may not stand there.
      {archiveOf(nullptr), "root: null stands where an object is needed"},
      {archiveOf(json::object()), "root: the object has no class name"},
      {state({{"lineItemResultSuccess", {line, {{"$class", "Foreign"}}}}}),
       "root.lineItemResultSuccess[1]: the class \"Foreign\" is not allowed here"},
      {state({{"lineItemResultSuccess", "text"}}),
       "root.lineItemResultSuccess: the class \"String\" is not allowed here"},
      {state({{"lineItemResultSuccess", {{{"$class", "StoredTransitLineItem"}, {"record", 1}}}}}),
       "root.lineItemResultSuccess[0].record: not a byte string but of the kind \"number\""},
      {state({{"lineItemResultSuccess", {{{"$class", "StoredTransitLineItem"}, {"record", json::binary({0x12, 9})}}}}}),
       "root.lineItemResultSuccess[0]: the record is broken: name: the length exceeds"},
      {state({{"lineItemResultError", {{"$class", "Error"}, {"code", 1}, {"userInfo", json::object()}}}}), "no domain"},
      {state({{"lineItemResultError",
               {{"$class", "Error"}, {"domain", "D"}, {"code", 1.5}, {"userInfo", json::object()}}}}),
       "root.lineItemResultError.code: not a signed 64-bit integer"},
      {state(
           {{"lineItemResultError", {{"$class", "Error"}, {"domain", "D"}, {"code", 1}, {"userInfo", {{"x", line}}}}}}),
       "root.lineItemResultError.userInfo.x: the class"},
  };
  for (const auto& [bytes, expected] : cases) {
    ErrorRef error;
    EXPECT_FALSE(State::unarchiveFromData_error(bytes, &error));
    EXPECT_EQ(error == nullptr, expected.empty()) << expected;
    EXPECT_THAT(error ? error->reason() : "", testing::HasSubstr(expected));
  }
  const Bytes whole = archived(State::initWithLineItemsResult_expanded(
      Result::resultWithValue(BoxedArray::of<TransitLineItem>({wholeLineItem<BasicTransitIncident>()})), true));
  for (std::size_t length = 0; length < whole.size(); ++length)
    EXPECT_FALSE(archive.unarchiverForReadingFromData(std::span(whole).first(length))) << length;
}

TEST_F(Archive, SavedRowsThatDoNotDecodeAreRemovedAndOthersKept) {
  constexpr const char* kKey = "Nimbo.TransitWidget.savedUIData";
  constexpr const char* kStateClass = "NBTransitIncidentViewControllerState";
  const auto store = platform.settings.groupStore();
  const auto load = [] {
    const auto controller = NBTransitIncidentsViewController::initWithNibName_bundle("", "", nullptr);
    controller->view();
    return controller;
  };
  const auto restored = [](const NBTransitIncidentsViewController& controller) {
    return !controller.dataSource()->transitLineItemResult()->isSuccess();
  };
  const auto unsaved = Error::errorWithDomain_code_userInfo("D", 1, {{"x", NamedImage::imageNamed("i")}});
  const Bytes saved = archived(State::initWithLineItemsResult_expanded(
      Result::resultWithError(Error::errorWithDomain_code_reason("D", 1, "saved")), false));
  const std::tuple<const char*, Bytes, bool, bool, const char*> cases[] = {
      {"a state", saved, true, true, "View model loaded"},
      {"no archive", {1, 2, 3}, false, true, "View model loaded"},
      {"a root of another class", archiveOf({{"$class", "Foreign"}}), false, true, "View model loaded"},
      {"another class deeper down",
       archiveOf({{"$class", kStateClass}, {"lineItemResultSuccess", {{{"$class", "Foreign"}}}}}), false, false,
       "Error parsing ViewModel data"},
  };
  EXPECT_FALSE(restored(*load()));
  EXPECT_TRUE(platform.log.contains("No view model found"));
  for (const auto& [name, record, isRestored, isKept, line] : cases) {
    platform.log.clear();
    store->setValue_forKey(record, kKey);
    EXPECT_EQ(restored(*load()), isRestored) << name;
    EXPECT_EQ(store->dataForKey(kKey), isKept ? std::optional(record) : std::nullopt) << name;
    EXPECT_TRUE(platform.log.contains(line)) << name;
  }

  store->setValue_forKey(saved, kKey);
  const auto controller = load();
  controller->viewWillAppear(false);
  platform.settings.writesFail = true;
  controller->dataSource()->updateTransitLineItemResult_captureAnalytics(
      Result::resultWithValue(BoxedArray::of<TransitLineItem>({})), nullptr);
  controller->viewWillDisappear(false);
  EXPECT_TRUE(platform.log.contains("The view model was not saved: the disk is full"));
  platform.settings.writesFail = false;
  controller->dataSource()->updateTransitLineItemResult_captureAnalytics(Result::resultWithError(unsaved), nullptr);
  controller->viewWillDisappear(false);
  EXPECT_TRUE(platform.log.contains("couldnt be converted to Blob"));
  EXPECT_EQ(store->dataForKey(kKey), saved);
}

}  // namespace
}  // namespace nimbo
