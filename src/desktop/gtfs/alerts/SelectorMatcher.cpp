#include "desktop/gtfs/alerts/SelectorMatcher.h"

#include "desktop/gtfs/alerts/RealtimeFields.h"
#include "desktop/gtfs/text/Identifier.h"

namespace nimbo {

namespace {

void readTrip(std::string_view body, EntitySelector& selector) {
  selector.hasTrip = true;
  for (auto trip = messageIn<TripDescriptorField>(body); trip.next();) {
    switch (trip.tag()) {
      case TripDescriptorField::tripID:
        selector.tripID = takeRequiredView(trip);
        break;
      case TripDescriptorField::routeID:
        selector.tripRouteID = takeRequiredView(trip);
        break;
      default:
        trip.skip();
    }
  }
}

}  // namespace

EntitySelector readEntitySelector(std::string_view body) {
  EntitySelector result;
  for (auto selector = messageIn<EntitySelectorField>(body); selector.next();) {
    switch (selector.tag()) {
      case EntitySelectorField::agencyID:
        result.agencyID = takeRequiredView(selector);
        break;
      case EntitySelectorField::routeID:
        result.routeID = takeRequiredView(selector);
        break;
      case EntitySelectorField::routeType:
        result.routeType = static_cast<RouteType>(takeRequiredNumber(selector));
        break;
      case EntitySelectorField::trip:
        readTrip(takeRequiredView(selector), result);
        break;
      case EntitySelectorField::stopID:
        result.hasStop = !takeRequiredView(selector).empty();
        break;
      case EntitySelectorField::directionID:
        result.hasDirection = true;
        selector.skip();
        break;
      default:
        selector.skip();
    }
  }
  return result;
}

namespace {

bool isWholeLine(const EntitySelector& selector) {
  return !selector.hasStop && !selector.hasTrip && !selector.hasDirection;
}

}  // namespace

SelectorMatcher::SelectorMatcher(const StaticFeed& feed, std::span<const std::uint32_t> lines, TripLookup trips)
    : _trips(std::move(trips)) {
  for (std::size_t i = 0; i < feed.agencyCount(); ++i) _agencies.emplace(feed.agency(i).id, i);
  for (const std::uint32_t index : lines) {
    const StaticLine line = feed.line(index);
    _placeOfRoute.emplace(line.routeID, _lines.size());
    _placeOfLine.emplace(index, _lines.size());
    _agencyOfLine.push_back(feed.agency(line.agency).id);
    _lines.push_back(line);
  }
}

void SelectorMatcher::addRoute(std::string_view id, std::size_t place) { _placeOfRoute.emplace(id, place); }

SelectorFit SelectorMatcher::match(const EntitySelector& selector, const Handler& handler) const {
  const Identifier agency(selector.agencyID), route(selector.routeID), trip(selector.tripID),
      tripRoute(selector.tripRouteID);
  EntitySelector clean = selector;
  clean.agencyID = agency.text();
  clean.routeID = route.text();
  clean.tripID = trip.text();
  clean.tripRouteID = tripRoute.text();
  return matchClean(clean, handler);
}

SelectorFit SelectorMatcher::matchClean(const EntitySelector& selector, const Handler& handler) const {
  std::string_view route = selector.routeID;
  if (route.empty())
    route = selector.tripRouteID;
  else if (!selector.tripRouteID.empty() && selector.tripRouteID != route)
    return SelectorFit::contradiction;
  if (!route.empty()) {
    const auto place = _placeOfRoute.find(route);
    return place == _placeOfRoute.end() ? SelectorFit::unknownRoute : matchOne(place->second, selector, handler);
  }
  if (!selector.tripID.empty()) return matchTrip(selector, handler);
  if (selector.hasStop) return SelectorFit::stopAlone;
  if (selector.hasTrip) return SelectorFit::nothingNamed;
  return matchAll(selector, handler);
}

SelectorFit SelectorMatcher::matchOne(std::size_t place, const EntitySelector& selector, const Handler& handler) const {
  const std::string_view agency = _agencyOfLine[place];
  if (!selector.agencyID.empty() && !agency.empty() && selector.agencyID != agency && isKnownAgency(selector.agencyID))
    return SelectorFit::contradiction;
  // A route type beside a route is not looked at: publishers write 0, the format's default, beside lines of any type
  // (Denver, 2026), and dropping such an alert would make a false good service.
  handler(place, isWholeLine(selector));
  return SelectorFit::lines;
}

SelectorFit SelectorMatcher::matchTrip(const EntitySelector& selector, const Handler& handler) const {
  const auto line = _trips(selector.tripID);
  if (!line) {
    _tripsError = line.error();
    return SelectorFit::tripsMissing;
  }
  if (!*line) return SelectorFit::unknownTrip;
  const auto place = _placeOfLine.find(**line);
  return place == _placeOfLine.end() ? SelectorFit::unknownRoute : matchOne(place->second, selector, handler);
}

SelectorFit SelectorMatcher::matchAll(const EntitySelector& selector, const Handler& handler) const {
  if (selector.agencyID.empty() && !selector.routeType) return SelectorFit::nothingNamed;
  // The only agency of a feed may go without an identifier: then every one means it.
  const bool isOnlyAgency = _agencies.size() == 1 && _agencies.begin()->first.empty();
  const bool anyAgency = selector.agencyID.empty() || isOnlyAgency;
  if (!anyAgency && !isKnownAgency(selector.agencyID)) return SelectorFit::unknownAgency;
  bool found = false;
  for (std::size_t i = 0; i < _lines.size(); ++i) {
    if (!anyAgency && _agencyOfLine[i] != selector.agencyID) continue;
    if (selector.routeType && !routeTypeCovers(*selector.routeType, _lines[i].type)) continue;
    handler(i, isWholeLine(selector));
    found = true;
  }
  return found ? SelectorFit::lines : SelectorFit::noLineOfType;
}

}  // namespace nimbo
