// Hand-offs through the real compressor and archive, and the decoder that shows them to people.

#include <nlohmann/json.hpp>

#include "desktop/archive/Bzip2.h"
#include "desktop/archive/CBORKeyedArchive.h"
#include "handoff/NBUserActivityData.h"
#include "handoff/NBUserActivityPayload.h"
#include "handoff/NimboActivity.h"
#include "process/HandoffDecoder.h"
#include "support/TestPlatform.h"
#include "widget/NBTransitIncidentViewControllerState.h"

namespace nimbo {
namespace {

using nlohmann::json;

class HandoffPayload : public testing::Test {
 protected:
  static Bytes payload(const NBUserActivityDataRef& data, std::string_view key) {
    return dynamic_cast<const NBUserActivityPayload&>(*data->userInfo()->objectForKey(key)).bytes().value();
  }

  /// One whose texts all have so many characters.
  static TransitIncidentRef wordyIncident(std::size_t length) {
    TransitIncidentFields fields;
    fields.muid = 1;
    fields.title = fields.summary = fields.fullDescription = std::string(length, 'x');
    return std::make_shared<const BasicTransitIncident>(std::move(fields));
  }

  CBORKeyedArchive archive;
  Bzip2Compressor compressor;
  TestPlatform platform{&archive, &compressor};
};

TEST_F(HandoffPayload, OfEachKindIsShownWithItsContent) {
  const Date date = *dateFromISOText("2026-01-05T12:00:00.5Z");
  const TransitLineItemRef line = lineItem(7, "Line 7", {incident(UINT64_MAX, date)});
  const auto shown = [](const Bytes& bytes) {
    const auto handoff = decodeHandoff(bytes);
    EXPECT_TRUE(handoff) << handoff.error()->reason();
    return handoff ? json::parse(handoff->text) : json();
  };
  const json lineJSON = shown(payload(activityDataForLineItem(line), "bs"))["NimboActivity"];
  EXPECT_EQ(lineJSON["displayOptions"], json({{"mapType", 3}}));
  EXPECT_EQ(lineJSON["lineItem"]["name"], "Line 7");
  const json incidentJSON{{"muid", UINT64_MAX},
                          {"title", "Incident 18446744073709551615"},
                          {"summary", "Summary 18446744073709551615"},
                          {"startDate", "2026-01-05T12:00:00.500000Z"}};
  EXPECT_EQ(lineJSON["lineItem"]["incidents"], json::array({incidentJSON}));
  EXPECT_EQ(shown(payload(activityDataForIncidents(line->incidents()), "incidentListKey")),
            json({{"incidentListKey", {incidentJSON}}}));
  EXPECT_EQ(shown(payload(activityDataForIncidents({}), "incidentListKey")),
            json({{"incidentListKey", json::array()}}));

  const auto state = NBTransitIncidentViewControllerState::initWithLineItemsResult_expanded(
      Result::resultWithError(Error::errorWithDomain_code_userInfo("D", 4, {{"data", box(Bytes{1, 0xab})}})), true);
  EXPECT_EQ(shown(*archive.archivedDataWithRootObject(state, true))["NBTransitIncidentViewControllerState"],
            json({{"expanded", true},
                  {"lineItemResultError", {{"domain", "D"}, {"code", 4}, {"userInfo", {{"data", "01ab"}}}}}}));

  NimboActivity activity;
  activity.setCollectionsMode(7);
  activity.setSearchString("caf\xe9");
  EXPECT_EQ(shown(activity.data())["NimboActivity"],
            json({{"collectionsMode", "(unknown: 7)"}, {"searchString", "caf\xef\xbf\xbd"}}));
}

TEST_F(HandoffPayload, ThatIsBrokenIsToldWithItsPlace) {
  const Bytes whole = payload(activityDataForLineItem(lineItem(1, "A")), "bs");
  Bytes longer = whole;
  longer.push_back(0);
  Bytes damaged = whole;
  damaged[damaged.size() / 2] ^= 0x10;
  const auto text = [](std::string_view content) { return Bytes(content.begin(), content.end()); };
  const TransitIncidents many(5001, incident(1));
  const struct {
    Bytes bytes;
    std::string reason;
  } cases[] = {
      {{}, "there are no bytes"},
      {longer, "other bytes follow the bzip2 stream, at byte " + std::to_string(whole.size())},
      {damaged, "the bzip2 stream is broken, at byte "},
      {*compressor.Bzip2Compress(Bytes((std::size_t{1} << 20) + 1)), "holds more than 1048576 bytes"},
      {Bytes((std::size_t{1} << 20) + 1), "more than 1048576 bytes"},
      {payload(activityDataForIncidents(many), "incidentListKey"), "there are 5001 incidents, more than 5000"},
      {payload(activityDataForLineItem(lineItem(1, "A", many)), "bs"), "there are 5001 incidents, more than 5000"},
      {payload(activityDataForIncidents({wordyIncident(std::size_t{1} << 20)}), "incidentListKey"),
       "the list of incidents has more than 1048576 bytes"},
      {*compressor.Bzip2Compress(text("\x7a\x02\x12\x09")),
       "lineItem.name: the length exceeds the bytes that follow, at byte 3"},
      {text("{}"), "lineItem: the length exceeds the bytes that follow, at byte 1"},
      {text("\xf2\x01\x01x"), "hold no field of an activity record"},
      {text("\x10\x01\x0c\x10"), "the end of a group that is not open, before byte 3 of 4"},
      {json::to_cbor({{"$archive", 9}}), "the archive is of version 9, not 1"},
      {json::to_cbor({{"$archive", 1}, {"root", 5}}), "the archive's root holds neither"},
      {text("\xa2\x68"), "the archive is broken: byte 3: "},
  };
  for (const auto& test : cases) {
    const auto shown = decodeHandoff(test.bytes);
    ASSERT_FALSE(shown) << shown->text;
    EXPECT_NE(shown.error()->reason().find(test.reason), std::string::npos)
        << shown.error()->reason() << "\nnot: " << test.reason;
  }
  for (std::size_t length = 4; length < whole.size(); ++length)
    EXPECT_NE(decodeHandoff(std::span(whole).first(length)).error()->reason().find("bzip2"), std::string::npos)
        << length;
}

TEST_F(HandoffPayload, IsShownWithinTheBoundsOfFeeds) {
  const TransitLineItemRef line = lineItem(1, std::string(501, 'n'), TransitIncidents(5000, wordyIncident(11)));
  const auto whole = decodeHandoff(payload(activityDataForLineItem(line), "bs"));
  ASSERT_TRUE(whole) << whole.error()->reason();
  EXPECT_EQ(whole->line->incidents.size(), 5000u);
  EXPECT_EQ(whole->line->incidents[0].title, std::string(11, 'x'));
  EXPECT_EQ(whole->line->name, std::string(500, 'n'));
  const auto list = decodeHandoff(payload(activityDataForIncidents({wordyIncident(10'001)}), "incidentListKey"));
  ASSERT_TRUE(list) << list.error()->reason();
  const protocol::Incident& shown = list->incidents->at(0);
  EXPECT_EQ(shown.title->size(), 500u);
  EXPECT_EQ(shown.summary->size(), 10'000u);
  EXPECT_EQ(shown.fullDescription->size(), 10'000u);
}

}  // namespace
}  // namespace nimbo
