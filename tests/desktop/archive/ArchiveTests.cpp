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
  const struct {
    ObjectRef root;
    const char* reason;
  } cases[] = {
      {array({box("a"), activity}), "root[1]: an object of the class NBUserActivityData cannot be archived"},
      {Error::errorWithDomain_code_userInfo("D", 0, {{"x", NamedImage::imageNamed("i")}}),
       "root.userInfo.x: an object of the class NamedImage cannot be archived"},
      {State::initWithLineItemsResult_expanded(
           Result::resultWithError(Error::errorWithDomain_code_userInfo("D", 0, {{"x", activity}})), true),
       "root.lineItemResultError.userInfo.x: an object of the class NBUserActivityData cannot be archived"},
      {box("\xff"), "root: a text is not UTF-8"},
      {deep, "nested too deep"},
      {box(Bytes(std::size_t{17} << 20)), "more than 16777216"},
      {nullptr, "root: an object of the class (null) cannot be archived"},
  };
  for (const auto& test : cases) {
    const auto archived = archive.archivedDataWithRootObject(test.root, true);
    ASSERT_FALSE(archived) << test.reason;
    EXPECT_NE(archived.error()->reason().find(test.reason), std::string::npos) << archived.error()->reason();
  }
}

/// What rows, the updater and the map application ask an incident.
auto answersOf(const TransitIncident& i) {
  std::vector<std::pair<std::uint64_t, bool>> entities;
  for (const auto& entity : i.affectedEntities()) entities.emplace_back(entity->muid(), entity->hasNextStopIDs());
  return std::tuple(i.muid(), i.title(), i.summary(), i.fullDescription(), i.messageForRoutePlanning(),
                    i.messageForRouteStepping(), i.messageForNonRoutable(), i.startDate(), i.endDate(),
                    i.creationDate(), i.lastUpdated(), i.iconType(), i.isBlockingIncident(), i.linkURL(), entities);
}

/// What they ask a line item, but for its artworks.
auto answersOf(const TransitLineItem& item) {
  std::vector<decltype(answersOf(*item.incidents()[0]))> incidents;
  for (const TransitIncidentRef& incident : item.incidents()) incidents.push_back(answersOf(*incident));
  const auto& system = item.system();
  return std::tuple(item.muid(), item.name(), item.lineColorString(), item.identifier()->locator(),
                    system ? std::pair(system->muid(), system->name()) : std::pair(std::uint64_t{0}, item.name()),
                    item.isBus(), item.hasLineColorString(), item.showVehicleNumber(), item.hasIncidentComponent(),
                    item.departuresAreVehicleSpecific(), item.isIncidentsTTLExpired(), item.hasEncyclopedicInfo(),
                    incidents);
}

TransitLineItemRef wholeLineItem() {
  TransitIncidentFields incidentFields;
  incidentFields.muid = UINT64_MAX;
  incidentFields.title = "Title";
  incidentFields.summary = "";
  incidentFields.fullDescription = "Full\nof signs: \xe2\x80\xae \xff";  // feeds are not always UTF-8
  incidentFields.messageForRoutePlanning = "planning";
  incidentFields.messageForRouteStepping = "stepping";
  incidentFields.messageForNonRoutable = "not routable";
  incidentFields.startDate = *dateFromISOText("0001-01-01T00:00:00Z");
  incidentFields.endDate = *dateFromISOText("9999-12-31T23:59:59.999999Z");
  incidentFields.creationDate = Date{};
  incidentFields.iconType = -5;
  incidentFields.isBlockingIncident = true;
  incidentFields.affectedEntities = {std::make_shared<BasicAffectedEntity>(9)};
  incidentFields.linkURL = "https://example.org/1";
  const auto whole = std::make_shared<const BasicTransitIncident>(incidentFields);
  BasicTransitLineItem::Fields fields;
  fields.identifier = std::make_shared<const MapItemIdentifier>(
      42, TransitLineLocator{"feed", "", "route", "S", TransitMode::monorail});
  fields.name = "S";
  fields.system = std::make_shared<const TransitSystem>(3, "Network", modeArtwork(TransitMode::rail));
  fields.artwork = shieldArtwork("Line S");
  fields.modeArtwork = modeArtwork(TransitMode::monorail);
  fields.alternateArtwork = shieldArtwork("S");
  fields.lineColorString = "#123456";
  fields.isBus = true;
  fields.incidents = {whole, incident(1), whole};
  return std::make_shared<const BasicTransitLineItem>(std::move(fields));
}

TEST_F(Archive, RestoredLineItemsAnswerLikeTheFetchedOnes) {
  const std::vector<TransitLineItemRef> items{wholeLineItem(), lineItem(2, "B")};
  const auto state = State::unarchiveFromData_error(
      archived(State::initWithLineItemsResult_expanded(Result::resultWithValue(BoxedArray::of(items)), true)), nullptr);
  ASSERT_TRUE(state);
  std::vector<TransitLineItemRef> restored;
  state->lineItemsResult()->withValue_orError(
      [&](const ObjectRef& value) {
        restored = dynamic_cast<const BoxedArray&>(*value).elementsOfClass<TransitLineItem>();
      },
      [](const ErrorRef&) {});
  ASSERT_EQ(restored.size(), items.size());
  for (std::size_t index = 0; index < items.size(); ++index) {
    const TransitLineItem &item = *items[index], &again = *restored[index];
    ASSERT_TRUE(answersOf(again) == answersOf(item)) << index;
    EXPECT_TRUE(again.artwork()->isEqual(item.artwork().get()));
    EXPECT_TRUE(artworksAreEquivalent(again.modeArtwork().get(), item.modeArtwork().get()));
    EXPECT_TRUE(artworksAreEquivalent(again.alternateArtwork().get(), item.alternateArtwork().get()));
    EXPECT_TRUE(!item.system() ||
                artworksAreEquivalent(again.system()->artwork().get(), item.system()->artwork().get()));
    // A snapshot of the snapshot is the same again.
    EXPECT_TRUE(StoredTransitLineItem::initWithLineItem(restored[index])->isEqual(restored[index].get()));
  }
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
  const struct {
    Bytes bytes;
    std::string error;  ///< part of the decoding error; empty: nothing, and no error
  } cases[] = {
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
  for (const auto& test : cases) {
    ErrorRef error;
    EXPECT_FALSE(State::unarchiveFromData_error(test.bytes, &error));
    const std::string reason = error ? error->reason() : "";
    EXPECT_TRUE(test.error.empty() ? !error : reason.find(test.error) != std::string::npos)
        << "expected: " << test.error << "\ngot: " << reason;
  }
  const Bytes whole = archived(State::initWithLineItemsResult_expanded(
      Result::resultWithValue(BoxedArray::of<TransitLineItem>({wholeLineItem()})), true));
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
  const struct {
    const char* name;
    Bytes record;
    bool isRestored, isKept;
    const char* line;
  } cases[] = {
      {"a state", saved, true, true, "View model loaded"},
      {"no archive", {1, 2, 3}, false, true, "View model loaded"},
      {"no result", archiveOf({{"$class", kStateClass}, {"expanded", true}}), false, true, "View model loaded"},
      {"a root of another class", archiveOf({{"$class", "Foreign"}}), false, true, "View model loaded"},
      {"another class deeper down",
       archiveOf({{"$class", kStateClass}, {"lineItemResultSuccess", {{{"$class", "Foreign"}}}}}), false, false,
       "Error parsing ViewModel data"},
  };
  EXPECT_FALSE(restored(*load()));
  EXPECT_TRUE(platform.log.contains("No view model found"));
  for (const auto& c : cases) {
    platform.log.clear();
    store->setValue_forKey(c.record, kKey);
    EXPECT_EQ(restored(*load()), c.isRestored) << c.name;
    EXPECT_EQ(store->dataForKey(kKey), c.isKept ? std::optional(c.record) : std::nullopt) << c.name;
    EXPECT_TRUE(platform.log.contains(c.line)) << c.name;
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
