#include "desktop/gtfs/feeds/FeedLookup.h"

#include <algorithm>
#include <unordered_map>

#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "platform/SystemServices.h"

namespace nimbo {

namespace {

/// The only line of this agency, short name and mode; absent when there are none or several.
std::optional<std::uint32_t> lineLike(const StaticFeed& feed, const TransitLineLocator& locator) {
  if (locator.shortName.empty()) return std::nullopt;
  std::optional<std::uint32_t> found;
  for (std::size_t i = 0; i < feed.lineCount(); ++i) {
    const StaticLine line = feed.line(i);
    if (line.shortName != locator.shortName || modeOfRouteType(line.type) != locator.mode ||
        feed.agency(line.agency).id != locator.agencyID)
      continue;
    if (found) return std::nullopt;
    found = static_cast<std::uint32_t>(i);
  }
  return found;
}

}  // namespace

std::vector<std::optional<FoundLine>> findLines(const StaticFeed& feed, const std::string& feedName,
                                                std::span<const MapItemIdentifierRef> identifiers) {
  std::unordered_map<std::uint64_t, std::optional<std::uint32_t>> lineOfMuid;
  for (const MapItemIdentifierRef& identifier : identifiers) lineOfMuid.try_emplace(identifier->muid());
  for (std::size_t i = 0; i < feed.lineCount(); ++i)
    if (const auto found = lineOfMuid.find(feed.line(i).muid); found != lineOfMuid.end())
      found->second = static_cast<std::uint32_t>(i);
  std::vector<std::optional<FoundLine>> lines;
  for (const MapItemIdentifierRef& identifier : identifiers) {
    std::optional<FoundLine>& found = lines.emplace_back();
    const auto& locator = identifier->locator();
    if (const auto line = lineOfMuid[identifier->muid()])
      found = {*line, {}};
    else if (const auto like = locator && locator->feed == feedName ? lineLike(feed, *locator) : std::nullopt)
      found = {*like, feed.hasRoute(locator->routeID) ? std::string() : locator->routeID};
  }
  return lines;
}

Outcome<FeedAnswer> lookUpInFeed(const FeedSource& source, std::span<const MapItemIdentifierRef> identifiers,
                                 std::string_view language, const std::stop_token& stop) {
  const auto loaded = source.staticFeed(stop);
  if (!loaded) return loaded.error();
  const StaticFeed& feed = loaded->feed;
  const auto lines = findLines(feed, source.name(), identifiers);
  FeedAnswer answer{TransitLineItems(identifiers.size()), std::nullopt};
  if (std::none_of(lines.begin(), lines.end(), [](const auto& line) { return line.has_value(); })) return answer;
  const auto alerts = source.alerts(stop);
  if (!alerts) return alerts.error();
  answer.asOf = alerts->timestamp();

  IncidentQuery query;
  query.feed = source.name();
  query.language = {language, feed.language()};
  query.minorAlerts = source.minorAlerts();
  query.now = currentDate();
  query.trips = loaded->trips;
  query.isRouteOfOther = source.isRouteOfOther(stop);
  std::unordered_map<std::uint32_t, std::size_t> placeOfLine;  // two identifiers may have become one line
  for (std::size_t i = 0; i < lines.size(); ++i) {
    if (!lines[i]) continue;
    const auto [place, isNew] = placeOfLine.try_emplace(lines[i]->index, query.lines.size());
    if (isNew) query.lines.push_back({lines[i]->index, identifiers[i]->muid()});
    if (!lines[i]->formerRouteID.empty()) query.lines[place->second].formerRouteIDs.push_back(lines[i]->formerRouteID);
  }
  const IncidentReading reading = readIncidents(*alerts, feed, query);
  LineItems makeItems(source.name(), feed);
  for (std::size_t i = 0; i < lines.size(); ++i) {
    if (!lines[i]) continue;
    const Verdict& verdict = reading.verdicts[placeOfLine.at(lines[i]->index)];
    if (verdict.unknownReason()) return verdict.unknownReason();
    answer.items[i] = makeItems.item(lines[i]->index, identifiers[i]->muid(), verdict.incidents());
  }
  return answer;
}

}  // namespace nimbo
