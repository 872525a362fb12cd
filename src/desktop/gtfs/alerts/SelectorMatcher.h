#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "desktop/gtfs/static/StaticFeed.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// What a part of an alert is about. Empty texts are absent fields; the texts are views of the feed.
struct EntitySelector {
  std::string_view agencyID;
  std::string_view routeID;
  std::optional<RouteType> routeType;
  std::string_view tripID;
  std::string_view tripRouteID;
  bool hasStop = false;
  bool hasTrip = false;
  bool hasDirection = false;
};

/// Reads an EntitySelector message. Throws protozero::exception for damaged bytes.
EntitySelector readEntitySelector(std::string_view body);

/// Whether a selector concerns a line, or why it concerns none of those that were given.
enum class SelectorFit {
  lines,
  stopAlone,  ///< stops; the lines that serve them are not known
  unknownRoute,
  unknownAgency,
  unknownTrip,
  tripsMissing,  ///< the trips that would tell cannot be had
  noLineOfType,
  contradiction,  ///< a route that is not of the agency or trip beside it
  nothingNamed,
};

/// Finds the lines that selectors of alerts concern, by identifiers that are cleaned as those of the static feed are.
/// The fields of a selector hold together: a route of an agency is that route. An agency that the static feed does not
/// know, or any route type, takes nothing away from a route that it does know. Source:
/// https://gtfs.org/documentation/realtime/reference/#message-entityselector
class SelectorMatcher {
 public:
  /// The index of a trip's line in the static feed, absent where its table has no such trip; an error when there is no
  /// table, or it cannot be read to its end.
  using TripLookup = std::function<Outcome<std::optional<std::uint32_t>>(std::string_view tripID)>;
  /// Takes the place of a line among those given, and whether the selector is about all of the line rather than about
  /// a stop, a trip or a direction of it.
  using Handler = std::function<void(std::size_t place, bool isWholeLine)>;

  /// For the lines of these indices in the static feed, which outlives this. `trips` is asked only about trips that
  /// come without a route.
  SelectorMatcher(const StaticFeed& feed, std::span<const std::uint32_t> lines, TripLookup trips);

  /// Another identifier under which alerts name the line at this place.
  void addRoute(std::string_view id, std::size_t place);

  /// Calls `handler` for each line that the selector concerns.
  SelectorFit match(const EntitySelector& selector, const Handler& handler) const;
  /// Why the trips could not be had when they were needed.
  const ErrorRef& tripsError() const { return _tripsError; }

 private:
  SelectorFit matchClean(const EntitySelector& selector, const Handler& handler) const;
  SelectorFit matchOne(std::size_t place, const EntitySelector& selector, const Handler& handler) const;
  SelectorFit matchTrip(const EntitySelector& selector, const Handler& handler) const;
  SelectorFit matchAll(const EntitySelector& selector, const Handler& handler) const;
  bool isKnownAgency(std::string_view id) const { return _agencies.contains(id); }

  std::vector<StaticLine> _lines;
  std::vector<std::string_view> _agencyOfLine;
  std::unordered_map<std::string_view, std::size_t> _placeOfRoute;
  std::unordered_map<std::uint32_t, std::size_t> _placeOfLine;
  std::unordered_map<std::string_view, std::size_t> _agencies;
  TripLookup _trips;
  mutable ErrorRef _tripsError;
};

}  // namespace nimbo
