#include <gmock/gmock.h>

#include "desktop/gtfs/Fixtures.h"
#include "desktop/gtfs/alerts/AlertTexts.h"

namespace nimbo {
namespace {

const char* const kAgencies = "agency_id,agency_name,agency_lang\nA,Trams,en\nB,Boats,en\n";
const char* const kRoutes =
    "route_id,agency_id,route_short_name,route_type\n"
    "t1,A,1,0\nt2,A,2,900\nb1,A,7,700\nb2,A,8,3\nf1,B,F,4\n";
const char* const kTrips = "route_id,service_id,trip_id\nb1,s,trip-7\n";

/// Alerts read against the two agencies' five lines.
class Reader {
 public:
  Reader()
      : _files{{"agency.txt", kAgencies}, {"routes.txt", kRoutes}, {"trips.txt", kTrips}},
        _parsed(readStaticFeed(_files, "city")),
        _feed(_parsed->feed.finish("", {})) {
    for (std::uint32_t i = 0; i < _feed.lineCount(); ++i) query.lines.push_back({i, _feed.line(i).muid});
    query.feed = "city";
    query.language = {"en", ""};
    query.now = dateFromUnixTime(kNow);
    query.countsUnfit = true;
    query.trips = [this](std::string_view trip) { return _parsed->trips.lineOfTrip(trip); };
  }

  IncidentReading read(const std::string& entities) {
    auto alerts = AlertsFeed::read(feedBytes(entities), "test");
    EXPECT_TRUE(alerts);
    unread = alerts->skipped();
    return readIncidents(*alerts, _feed, query);
  }

  /// The short names of lines that have incidents.
  std::string lines(const IncidentReading& reading) {
    std::string names;
    for (std::size_t i = 0; i < query.lines.size(); ++i)
      if (!reading.verdicts[i].incidents().empty()) names += _feed.line(query.lines[i].index).shortName;
    return names;
  }

  /// The incidents of line 1, by their periods in seconds from now.
  static std::string periods(const IncidentReading& reading) {
    const auto fromNow = [](std::optional<Date> date) {
      return date ? std::to_string(static_cast<long>(intervalBetween(dateFromUnixTime(kNow), *date))) : "";
    };
    std::string text;
    for (const auto& incident : reading.verdicts[0].incidents())
      text += fromNow(incident->startDate()) + ".." + fromNow(incident->endDate()) + " ";
    return text;
  }

  IncidentQuery query;
  SkipReport unread;  // entities of the feed that was read last

 private:
  MemoryFeedFiles _files;
  Outcome<ParsedStaticFeed> _parsed;
  StaticFeed _feed;
};

TEST(Selector, ConcernsTheLinesThatAllItsFieldsMean) {
  const char* const cases[][3] = {
      {"route_id: 't1'", "1", ""},
      {"agency_id: 'unheard of' route_id: 't1'", "1", ""},
      {"agency_id: 'B' route_id: 't1'", "", "route that is not of the agency or trip beside it"},
      {"route_type: 700 route_id: 'b2'", "8", ""},
      {"route_type: 1 route_id: 'b2'", "8", ""},
      {"agency_id: 'A'", "1278", ""},
      {"agency_id: 'unheard of'", "", "agency that the static feed does not have"},
      {"route_type: 0", "12", ""},
      {"route_type: 3", "78", ""},
      {"route_type: 702", "", "route type that no line has"},
      {"agency_id: 'B' route_type: 3", "", "route type that no line has"},
      {"route_id: 't1' stop_id: 's' direction_id: 1", "1", ""},
      {"agency_id: 'A' stop_id: 's'", "", "stop alone (which lines serve it is not known)"},
      {"agency_id: 'A' trip { route_id: 't2' }", "2", ""},
      {"trip { trip_id: 'trip-7' }", "7", ""},
      {"trip { trip_id: 'trip-8' }", "", "trip without a route, not in the static feed"},
      {"route_id: 'gone'", "", "route that the static feed does not have"},
      {"route_id: ''", "", "selector that names no line"},
  };
  for (const auto& [selector, lines, unfit] : cases) {
    Reader reader;
    const IncidentReading reading = reader.read(alert("a", "T", "informed_entity { " + std::string(selector) + " }"));
    EXPECT_EQ(reader.lines(reading), lines) << selector;
    std::string reasons;
    for (const auto& entry : reading.unfit.entries()) reasons += entry.reason;
    EXPECT_EQ(reasons, unfit) << selector;
  }
}

TEST(Periods, EachIsAnIncidentOfOneNumber) {
  const auto at = [](long offset) { return std::to_string(static_cast<long>(kNow) + offset); };
  const auto range = [&](const std::string& field, long start, long end) {
    return field + " { start: " + at(start) + " end: " + at(end) + " } ";
  };
  const std::tuple<const char*, std::string, std::string> cases[] = {
      {"none: always", "", ".. "},
      {"by date, not as published", range("active_period", 500, 600) + range("active_period", -5, 5),
       "-5..5 500..600 "},
      {"overlapping and touching ones are one",
       range("active_period", 0, 9) + range("active_period", 5, 20) + range("active_period", 20, 30) +
           range("active_period", 6, 7),
       "0..30 "},
      {"open ends", "active_period { end: " + at(9) + " } active_period { start: " + at(50) + " end: 0 }", "..9 50.. "},
      {"no end as publishers write it", "active_period { start: " + at(-9) + " end: 18446744073709551615 }", "-9.. "},
      {"the year 3000", "active_period { start: 0 end: 32503680000 }", "..30753680000 "},
      {"milliseconds", "active_period { start: " + at(-9) + "000 end: " + at(9) + "000 }", "-9..9 "},
      {"an end at or before its start",
       range("active_period", 5, 5) + range("active_period", 9, 2) + range("active_period", 1, 2), "1..2 "},
      {"nothing but such: never", range("active_period", 5, 5), ""},
      {"impact before communication before active",
       range("active_period", 1, 2) + range("impact_period", 7, 8) + range("communication_period", 4, 5), "7..8 "},
      {"over for more than a day", range("active_period", -200000, -100000) + range("active_period", -60, -30),
       "-60..-30 "},
  };
  for (const auto& [what, fields, periods] : cases) {
    Reader reader;
    const IncidentReading reading = reader.read(alert("a", "T", route("t1") + fields));
    EXPECT_EQ(Reader::periods(reading), periods) << what;
    for (const auto& incident : reading.verdicts[0].incidents())
      EXPECT_EQ(incident->muid(), reading.verdicts[0].incidents()[0]->muid());
  }
}

TEST(Periods, ToComeAreTheNextSixteen) {
  std::string fields;
  for (int day = 259; day >= 0; --day)
    fields += "active_period { start: " + std::to_string(kNow - 10 + static_cast<std::uint64_t>(day) * 86400) +
              " end: " + std::to_string(kNow + static_cast<std::uint64_t>(day) * 86400) + " } ";
  Reader reader;
  const IncidentReading reading = reader.read(alert("a", "T", route("t1") + fields));
  ASSERT_EQ(reading.verdicts[0].incidents().size(), 17u);  // one is in force
  EXPECT_EQ(reading.verdicts[0].incidents().back()->startDate(), dateFromUnixTime(kNow - 10 + 16 * 86400));
  EXPECT_EQ(reading.periods, 260u);
}

TEST(Alert, IsSkippedAloneAndCountedUnlessSevereOrAskedFor) {
  const std::string t2 = route("t2"), minor = "alert without effect on the service, or about accessibility";
  const std::tuple<std::string, bool, std::string, std::string> cases[] = {
      {"entity { id: 'x' is_deleted: true alert { " + t2 + "} }", false, "1", "deleted entity"},
      {"entity { id: 'x' trip_update { trip_id: 'trip-7' } }", false, "1", "entity that is no alert"},
      {"entity { id: 'x' }", false, "1", "entity without content"},
      {alert("x", " \\n", t2), false, "1", "alert that says nothing"},
      {alert("x", "T", t2 + "effect: 10"), false, "1", minor},
      {alert("x", "T", t2 + "effect: 11"), false, "1", minor},
      {alert("x", "Fire", t2 + "effect: 10 severity_level: 4"), false, "12", ""},
      {alert("x", "Lift", t2 + "effect: 11"), true, "12", ""},
  };
  for (const auto& [entity, minorAlerts, lines, reason] : cases) {
    Reader reader;
    reader.query.minorAlerts = minorAlerts;
    const IncidentReading reading = reader.read(entity + alert("a", "T", route("t1")));
    EXPECT_EQ(reader.lines(reading), lines) << entity;
    std::string reasons;
    for (const SkipReport& report : {reader.unread, reading.skipped})
      for (const auto& skipped : report.entries()) reasons += skipped.reason;
    EXPECT_EQ(reasons, reason);
  }
}

TEST(AlertsFeed, IsRefusedWithWhatItIsInstead) {
  const std::string address = "https://example.org/alerts";
  const std::pair<std::string, std::string> cases[] = {
      {"", "it is empty"},
      {"<!doctype html><title>Sorry</title>", "web page"},
      {"\n{\"entity\": []}", "JSON"},
      {feedBytes(alert("a", "T", "")).erase(20), "cut off"},
      {std::string("\x0A\x07\x0A\x03") + "2.0\x10\x01", "DIFFERENTIAL"},
  };
  for (const auto& [bytes, what] : cases) {
    const auto feed = AlertsFeed::read(bytes, address);
    ASSERT_FALSE(feed) << what;
    EXPECT_THAT(feed.error()->reason(), testing::AllOf(testing::HasSubstr(what), testing::HasSubstr(address)));
  }
}

TEST(Alert, TextsComeFromWhatThereIs) {
  const std::string description = "description_text { translation { text: 'Stop <b>closed</b>.\\n\\nUse stop B.' } } ";
  const std::string detail = "effect_detail { translation { text: 'Stop shift' } } ";
  using Text = std::optional<std::string>;
  const std::tuple<const char*, std::string, Text, Text, Text> cases[] = {
      {"header", "header_text { translation { text: 'Works\\non line 1 ' } } " + description, "Works on line 1",
       "Stop closed.", "Stop closed.\n\nUse stop B."},
      {"first line of the description", description + detail, "Stop closed.", "Use stop B.",
       "Stop closed.\n\nUse stop B."},
      {"the effect's detail", "effect: 9 " + detail, "Stop shift", {}, {}},
      {"the effect's own words", "effect: 9 header_text { translation { text: ' ' } }", "Haltestelle verlegt", {}, {}},
      {"an effect of the future", "effect: 77", {}, {}, {}},
      {"a description that only repeats the header",
       "header_text { translation { text: 'No service.' } } "
       "description_text { translation { text: '<p>No\\nservice</p>' } }",
       "No service.",
       {},
       {}},
  };
  for (const auto& [what, text, title, summary, whole] : cases) {
    transit_realtime::Alert message;
    ASSERT_TRUE(google::protobuf::TextFormat::ParseFromString(text, &message));
    const auto texts =
        alertTextsIn(message.SerializeAsString(), static_cast<AlertEffect>(message.effect()), {"de", ""});
    ASSERT_EQ(texts.has_value(), title.has_value()) << what;
    if (!texts) continue;
    EXPECT_EQ(texts->title, title) << what;
    EXPECT_EQ(texts->summary, summary) << what;
    EXPECT_EQ(texts->description, whole) << what;
  }
}

TEST(Alert, ImageIsOfTheBestLanguageAndOfAKindThatIsShown) {
  const auto localized = [](const std::string& url, const std::string& kind, const std::string& language) {
    return "localized_image { url: '" + url + "' media_type: '" + kind + "' language: '" + language + "' } ";
  };
  const std::string text =
      "image_alternative_text { translation { text: 'Map' } translation { text: 'Plan' language: 'de' } }";
  const std::string en = localized("https://a/en", "image/png", "en"),
                    de = localized(" https://a/de", "IMAGE/JPEG ", "de");
  const std::pair<std::string, std::optional<std::string>> cases[] = {
      {en + de, "https://a/de"},
      {de + en, "https://a/de"},
      {en + localized("https://a/de", "image/svg+xml", "de"), "https://a/en"},
      {localized("https://a/de", "image/webp", "de"), {}},
      {localized("file:///etc/passwd", "image/png", "de"), {}},
      {"", {}}};
  for (const auto& [images, address] : cases) {
    transit_realtime::Alert message;
    ASSERT_TRUE(google::protobuf::TextFormat::ParseFromString("image { " + images + "} " + text, &message));
    const AlertImage image = alertImageIn(message.SerializeAsString(), {"de", ""});
    EXPECT_EQ(image.address, address) << images;
    EXPECT_EQ(image.text, "Plan");
  }
}

TEST(Alert, SummaryLeavesOutATitleThatStandsByItself) {
  const char* const cases[][3] = {
      {"No service", "No service: trains rest.", "trains rest."},
      {"No service!", "No service! Trains rest.", "Trains rest."},
      {"Why wait?", "Why wait? Walk.", "Walk."},
      {"Line 1.", "Line\n1\nis closed.", "is closed."},
      {"Line 1", "Line 1 is closed until Friday.", "Line 1 is closed until Friday."},
      {"Line 1", "Line 1, 2 and 3 are closed.", "Line 1, 2 and 3 are closed."},
      {"Line 1", "Line 1.5 km long.", "Line 1.5 km long."},
      {"Line 1", "Line 12: closed.", "Line 12: closed."},
  };
  for (const auto& [title, description, summary] : cases) {
    transit_realtime::Alert message;
    message.mutable_header_text()->add_translation()->set_text(title);
    message.mutable_description_text()->add_translation()->set_text(description);
    const auto texts = alertTextsIn(message.SerializeAsString(), AlertEffect::unknownEffect, {"en", ""});
    EXPECT_EQ(texts->summary, summary);
    EXPECT_EQ(texts->description, description);
  }
}

TEST(Incident, IsOneForAllAlertsOfItsContent) {
  const std::string later = "active_period { start: " + std::to_string(kNow + 100) + " } ";
  Reader reader;
  const IncidentReading reading = reader.read(alert("z", "Strike", route("t1") + "cause: 4") +
                                              alert("b", "Strike", route("t2") + "cause: 4 " + later) +
                                              alert("c", "Strike", route("b1") + "cause: 5"));
  const auto& first = reading.verdicts[0].incidents().at(0);
  const auto& second = reading.verdicts[1].incidents().at(0);
  EXPECT_EQ(first->muid(), second->muid());
  EXPECT_EQ(first->affectedEntities().size(), 2u);
  EXPECT_EQ(first->startDate(), std::nullopt);  // each line in the periods of its own alert
  EXPECT_EQ(second->startDate(), dateFromUnixTime(kNow + 100));
  EXPECT_NE(first->muid(), reading.verdicts[2].incidents().at(0)->muid());  // another cause

  // The number depends neither on the order of the feed nor on the lines that were asked for.
  reader.query.lines.resize(1);
  const IncidentReading other = reader.read(alert("b", "Strike", route("t2") + "cause: 4 " + later) +
                                            alert("z", "Strike", route("t1") + "cause: 4"));
  EXPECT_EQ(other.verdicts[0].incidents().at(0)->muid(), first->muid());
}

TEST(Incident, OfOneIdentifierInSeveralEntities) {
  const auto entity = [](const std::string& id, const std::string& routeID, const std::string& translation) {
    return "entity { id: '" + id + "' alert { " + route(routeID) + "header_text { translation { " + translation +
           " } } } } ";
  };
  const std::string dutch = entity("x", "t1", "text: 'Staking' language: 'nl'"),
                    english = entity("x", "t1", "text: 'Strike' language: 'en'"),
                    flood = entity("x", "t1", "text: 'Flood' language: 'en'");
  Reader reader;
  const IncidentReading languages = reader.read(dutch + english);
  ASSERT_EQ(languages.verdicts[0].incidents().size(), 1u);
  EXPECT_EQ(languages.verdicts[0].incidents()[0]->title(), "Strike");
  reader.query.language.user = "nl";  // whose text the third alert does not have
  const IncidentReading inDutch = reader.read(dutch + english + entity("y", "t2", "text: 'Strike' language: 'en'"));
  EXPECT_EQ(inDutch.verdicts[0].incidents().at(0)->title(), "Staking");
  EXPECT_EQ(inDutch.verdicts[1].incidents().at(0)->title(), "Strike");
  const IncidentReading others = reader.read(english + flood);
  ASSERT_EQ(others.verdicts[0].incidents().size(), 2u);
  EXPECT_NE(others.verdicts[0].incidents()[0]->muid(), others.verdicts[0].incidents()[1]->muid());
}

TEST(Incident, BlocksOnlyALineThatDoesNotRunAtAll) {
  Reader reader;
  const IncidentReading reading = reader.read(
      alert("a", "T",
            route("t1") + "informed_entity { route_id: 't2' stop_id: 's' } effect: 1 url { translation { text: "
                          "'https://example.org/a' } }"));
  const auto& incident = reading.verdicts[0].incidents().at(0);
  EXPECT_TRUE(incident->isBlockingIncident());
  EXPECT_FALSE(reading.verdicts[1].incidents().at(0)->isBlockingIncident());
  EXPECT_EQ(incident->iconType(), 1);
  EXPECT_EQ(incident->linkURL(), "https://example.org/a");
  EXPECT_EQ(incident->messageForRouteStepping(), "T");
  EXPECT_EQ(incident->lastUpdated(), std::nullopt) << "the date of the feed is none of the incident";
}

TEST(Incident, ConcernsRidersByItsDetailBeforeItsEffect) {
  const std::tuple<const char*, int, AlertConcern> cases[] = {
      {"DELAY", 7, AlertConcern::delays},
      {"Station closure", 1, AlertConcern::other},
      {"SUSPENSION", 4, AlertConcern::noService},
      {"EXTRA_SERVICE", 8, AlertConcern::additionalService},
      {"ELEVATOR_CLOSURE", 8, AlertConcern::none},
      {"INFORMATIONAL", 7, AlertConcern::none},
      {"INFORMATIONAL", 4, AlertConcern::detour},
      {"Track fire", 3, AlertConcern::delays},
      {"", 2, AlertConcern::reducedService},
      {"", 11, AlertConcern::none},
      {"", 8, AlertConcern::other},
  };
  for (const auto& [detail, effect, expected] : cases)
    EXPECT_EQ(concernOf(AlertEffect{effect}, detail), expected) << detail;
  // Of several alerts that are one incident the gravest counts, and what is severe is never nothing.
  const std::string delay = "effect_detail { translation { text: 'DELAY' language: 'en' } } ";
  const std::string lift = "effect_detail { translation { text: 'ELEVATOR_CLOSURE' } } ";
  Reader reader;
  const auto concern = [&](const std::string& entities) {
    return dynamic_cast<const AlertIncident&>(*reader.read(entities).verdicts[0].incidents().at(0)).fields().concern;
  };
  EXPECT_EQ(concern(alert("a", "T", route("t1") + lift) + alert("b", "T", route("t1") + delay)), AlertConcern::delays);
  EXPECT_EQ(concern(alert("a", "T", route("t1") + lift + "severity_level: 4")), AlertConcern::other);
  EXPECT_EQ(concern(alert("a", "T", route("t1") + lift)), AlertConcern::none);
  EXPECT_EQ(concern(alert("a", "T", route("t1") + "effect: 5 severity_level: 4")), AlertConcern::additionalService);
}

}  // namespace
}  // namespace nimbo
