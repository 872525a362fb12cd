// A publisher's alerts feed, up to the incidents of lines.

#include <array>
#include <set>
#include <tuple>

#include "Fuzz.h"
#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/static/StaticFeedBuilder.h"

namespace nimbo {

namespace {

const StaticFeed& city() {
  static const StaticFeed feed = [] {
    StaticFeedBuilder builder("city");
    builder.setLanguage("en");
    for (const char* agency : {"M", "B"}) builder.addAgency(agency, agency);
    for (const auto& [agency, route, type] : {std::tuple{"M", "m1", 1}, {"M", "m2", 1}, {"B", "b1", 3}}) {
      StaticLine line;
      line.routeID = line.shortName = route;
      line.type = type;
      builder.addLine(agency, line);
    }
    return builder.finish("", {});
  }();
  return feed;
}

std::vector<Verdict> verdictsOf(const AlertsFeed& alerts, std::span<const std::uint32_t> lines) {
  IncidentQuery query;
  query.feed = "city";
  query.language = {"de-AT", "en"};
  query.minorAlerts = query.countsUnfit = true;
  query.now = Date(std::chrono::seconds(1'750'000'000));
  for (const std::uint32_t line : lines) query.lines.push_back({line, city().line(line).muid});
  query.trips = [](std::string_view trip) { return trip == "t" ? std::optional(1u) : std::nullopt; };
  return readIncidents(alerts, city(), query).verdicts;
}

void requireSound(const TransitIncident& incident) {
  require(incident.title() && !incident.title()->empty() && incident.title()->find('\n') == std::string::npos,
          "an incident has a title of one line");
  for (const auto& text : {incident.title(), incident.summary(), incident.fullDescription()})
    if (text) requirePlain(*text);
  require(!incident.startDate() || !incident.endDate() || *incident.startDate() < *incident.endDate(),
          "an incident starts before it ends");
  const std::string link = asciiLowerCase(incident.linkURL().value_or("http:"));
  require(link.starts_with("http:") || link.starts_with("https:"), "a link is a web address");
}

/// Without the order: incidents stand where the first of the lines that were asked for has them.
auto whatIsToldBy(const TransitIncidents& incidents) {
  std::multiset<std::tuple<std::optional<std::string>, std::optional<Date>, std::optional<Date>, bool>> told;
  for (const auto& incident : incidents)
    told.emplace(incident->title(), incident->startDate(), incident->endDate(), incident->isBlockingIncident());
  return told;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const auto alerts = AlertsFeed::read(std::string(textOf(data, size)), "fuzz");
  if (!alerts) return 0;
  const std::uint32_t all[] = {0, 1, 2};
  const auto verdicts = verdictsOf(*alerts, all);
  for (const std::uint32_t line : all) {
    for (const auto& incident : verdicts[line].incidents()) requireSound(*incident);
    const Verdict alone = verdictsOf(*alerts, std::array{line}).front();
    require(whatIsToldBy(alone.incidents()) == whatIsToldBy(verdicts[line].incidents()),
            "a line has the same incidents whatever else is asked for");
    require(!alone.unknownReason() == !verdicts[line].unknownReason(), "a line is known whatever else is asked for");
  }
  return 0;
}

}  // namespace nimbo
