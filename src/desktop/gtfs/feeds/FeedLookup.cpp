#include "desktop/gtfs/feeds/FeedLookup.h"

#include <algorithm>
#include <map>
#include <tuple>
#include <unordered_map>

#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "platform/DueAnswer.h"
#include "platform/SystemServices.h"
#include "platform/wire/StoredTransitIncident.h"

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

HeldAnswer::Question questionOf(const StaticFeed& feed, std::span<const MapItemIdentifierRef> identifiers,
                                std::string_view language) {
  HeldAnswer::Question question{feed.checksum(), {}, std::string(language)};
  for (const MapItemIdentifierRef& identifier : identifiers)
    question.lines.emplace_back(identifier->muid(), identifier->locator());
  return question;
}

/// The objects of the last answer, for those of a new one that say the same.
class HeldObjects {
 public:
  explicit HeldObjects(const TransitLineItems& items) {
    for (const TransitLineItemRef& item : items)
      if (item)
        for (const TransitIncidentRef& incident : item->incidents()) _incidents.emplace(keyOf(*incident), incident);
  }

  TransitIncidents orHeld(TransitIncidents incidents) const {
    for (TransitIncidentRef& incident : incidents)
      if (const auto held = _incidents.find(keyOf(*incident));
          held != _incidents.end() && isSameKind(*held->second, *incident) &&
          StoredTransitIncident::areAlike(*held->second, *incident))
        incident = held->second;
    return incidents;
  }

 private:
  using Key = std::tuple<std::uint64_t, std::optional<Date>, bool>;
  static Key keyOf(const TransitIncident& incident) {
    return {incident.muid(), incident.startDate(), incident.isBlockingIncident()};
  }
  /// What records leave out.
  static bool isSameKind(const TransitIncident& a, const TransitIncident& b) {
    const auto kindOf = [](const TransitIncident& incident) {
      const AlertIncident::Fields& fields = static_cast<const AlertIncident&>(incident).fields();
      return std::tie(fields.effect, fields.cause, fields.severity, fields.concern, fields.image);
    };
    return kindOf(a) == kindOf(b);
  }
  std::map<Key, TransitIncidentRef> _incidents;
};

/// Whether the answer holds from now until a lookup that begins now is over.
bool holds(const HeldAnswer& held, Date now) {
  return held.from <= now && now < held.until && intervalBetween(now, held.until) > DueAnswer::kPatience;
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
                                 std::string_view language, HeldAnswer& held, Date notBefore,
                                 const std::stop_token& stop) {
  const auto loaded = source.staticFeed(stop);
  if (!loaded) return loaded.error();
  const StaticFeed& feed = loaded->feed;
  HeldAnswer::Question question = questionOf(feed, identifiers, language);
  const bool isHeld = held.question == question && held.hash == held.alerts.hash && holds(held, currentDate());
  FeedAnswer answer{TransitLineItems(identifiers.size()), {}, {}};
  std::vector<std::optional<FoundLine>> lines;
  if (!isHeld) lines = findLines(feed, source.name(), identifiers);
  if (!isHeld && std::ranges::none_of(lines, [](const auto& line) { return line.has_value(); })) return answer;
  const auto alerts = source.alerts(held.alerts, !isHeld, notBefore, stop);
  if (!alerts) return alerts.error();
  FeedAnswer& told = *alerts ? answer : held.answer;
  if (held.alerts.fetchedAt != Date()) told.answeredAt = held.alerts.fetchedAt;
  told.isShared = held.alerts.isShared;
  if (!*alerts) return held.answer;
  if (isHeld) lines = findLines(feed, source.name(), identifiers);
  answer.asOf = (*alerts)->timestamp();

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
  const IncidentReading reading = readIncidents(**alerts, feed, query);
  LineItems makeItems(source.name(), feed);
  const HeldObjects heldObjects(held.answer.items);
  for (std::size_t i = 0; i < lines.size(); ++i) {
    if (!lines[i]) continue;
    const Verdict& verdict = reading.verdicts[placeOfLine.at(lines[i]->index)];
    if (verdict.unknownReason()) return verdict.unknownReason();
    TransitIncidents incidents = heldObjects.orHeld(verdict.incidents());
    if (held.question == question && held.answer.items[i]->incidents() == incidents)
      answer.items[i] = held.answer.items[i];
    else
      answer.items[i] = makeItems.item(lines[i]->index, identifiers[i]->muid(), std::move(incidents));
  }
  held.question = question;
  held.hash = held.alerts.hash;
  held.from = query.now;
  held.until = reading.holdsUntil;
  held.answer = answer;
  return answer;
}

}  // namespace nimbo
