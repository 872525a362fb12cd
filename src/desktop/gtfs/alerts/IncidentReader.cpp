#include "desktop/gtfs/alerts/IncidentReader.h"

#include <algorithm>
#include <map>
#include <set>
#include <tuple>
#include <unordered_map>
#include <unordered_set>

#include "desktop/gtfs/ContentHash.h"
#include "desktop/gtfs/alerts/AlertPeriods.h"
#include "desktop/gtfs/alerts/AlertView.h"
#include "desktop/gtfs/feeds/FeedMuid.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/text/Identifier.h"

namespace nimbo {

namespace {

constexpr std::size_t kFewestForeignRoutes = 3;  // fewer may be lines that the static feed does not have yet
constexpr std::size_t kMostIncidents = 5000;     // whole countries have fewer; each costs memory on every line

/// An alert, or several of one content.
struct Incident {
  std::string key;  // the least of its alerts
  AlertTexts texts;
  AlertImage image;
  AlertEffect effect;
  std::int32_t cause;
  std::int32_t severity;  // the greatest of its alerts
  AlertConcern concern;   // the same
  struct OnLine {
    std::vector<AlertPeriod> periods;
    bool isWholeLine = false;
  };
  std::map<std::size_t, OnLine> lines;  // by place in the query
};

struct AlertContentHash {
  std::size_t operator()(const AlertContent& content) const { return content.hash(); }
};

std::string_view reasonFor(SelectorFit fit) {
  switch (fit) {
    case SelectorFit::lines:
      break;
    case SelectorFit::stopAlone:
      return "stop alone (which lines serve it is not known)";
    case SelectorFit::unknownRoute:
      return "route that the static feed does not have";
    case SelectorFit::unknownAgency:
      return "agency that the static feed does not have";
    case SelectorFit::unknownTrip:
      return "trip without a route, not in the static feed";
    case SelectorFit::tripsMissing:
      return "trip without a route (the trips cannot be read)";
    case SelectorFit::noLineOfType:
      return "route type that no line has";
    case SelectorFit::contradiction:
      return "route that is not of the agency or trip beside it";
    case SelectorFit::nothingNamed:
      return "selector that names no line";
  }
  return {};
}

std::string exampleOf(const EntitySelector& selector) {
  std::string text;
  const auto add = [&](std::string_view name, std::string_view value) {
    if (!value.empty()) text.append(text.empty() ? "" : ", ").append(name).append(" ").append(value);
  };
  add("agency", selector.agencyID);
  add("route", selector.routeID);
  add("route type", selector.routeType ? std::to_string(*selector.routeType) : "");
  add("trip", selector.tripID);
  add("trip of route", selector.tripRouteID);
  return text;
}

class IncidentBuilder {
 public:
  IncidentBuilder(const AlertsFeed& alerts, const StaticFeed& feed, const IncidentQuery& query)
      : _alerts(alerts),
        _feed(feed),
        _query(query),
        _matcher(feed, indicesOf(query), query.trips),
        _gap(alerts.gap()),
        _incidentsOfLines(query.lines.size()) {
    for (std::size_t i = 0; i < query.lines.size(); ++i)
      for (const std::string& former : query.lines[i].formerRouteIDs) _matcher.addRoute(former, i);
    _quickHashes.reserve(alerts.alerts().size());
  }

  IncidentReading build() {
    for (const AlertEntity& alert : _alerts.alerts()) take(alert);
    if (_query.isRouteOfOther && !_belongs && _foreignRoutes.size() >= kFewestForeignRoutes)
      _belongs = std::any_of(_foreignRoutes.begin(), _foreignRoutes.end(), _query.isRouteOfOther);
    if (!_belongs && _foreignRoutes.size() >= kFewestForeignRoutes)
      lacks(transitLineServiceError(
          TransitLineServiceError::foreignAlerts,
          "The alerts feed " + _alerts.place() + " names routes that its static feed does not have, such as " +
              *_foreignRoutes.begin() + ", and none that it has. Check that the two belong together.",
          _alerts.place()));
    if (!_incidents.empty()) takeLeastKeys();
    for (Incident& incident : _incidents) emit(incident);
    for (TransitIncidents& incidents : _incidentsOfLines)
      _reading.verdicts.push_back(Verdict::of(std::move(incidents), _gap));
    return std::move(_reading);
  }

 private:
  static std::vector<std::uint32_t> indicesOf(const IncidentQuery& query) {
    std::vector<std::uint32_t> indices;
    for (const IncidentQuery::Line& line : query.lines) indices.push_back(line.index);
    return indices;
  }

  /// The identifier; where alerts share one, or have none, with the content, since the number may not depend on
  /// positions.
  static std::string keyOf(const AlertEntity& alert) {
    std::string key(alert.id);
    if (alert.isRepeated || alert.id.empty()) key.append(1, '\0').append(std::to_string(hashOfBytes(alert.body)));
    return key;
  }

  void take(const AlertEntity& alert) {
    _lines.clear();
    _hasTrips = _hasRoutes = false;
    AlertView view = readAlertView(alert.body, [&](const EntitySelector& selector) { takeSelector(selector); });
    view.isDamaged = view.isDamaged || alert.breaksOff;
    if (view.isDamaged && view.selectors == 0) {
      _reading.skipped.add("alert that is damaged", alert.id);
      return lacks(alertBreaksOff(_alerts.place()));
    }
    _quickHashes.emplace_back(&alert, view.content.quickHash());
    if (_lines.empty() && !_hasTrips && (_belongs || !_hasRoutes)) return;
    AlertPeriods periods = alertPeriodsIn(view.body);
    const std::size_t published = periods.published;
    const bool isNever = periods.periods.empty();
    _reading.holdsUntil = std::min(_reading.holdsUntil, nextChangeOf(periods.periods, _query.now));
    // Before each line gets its copy: an alert may have millions.
    const auto mattering = periodsThatMatter(joinedPeriods(std::move(periods.periods)), _query.now);
    if (_hasRoutes && !_belongs && isInForce(mattering)) takeRoutes(view);
    const bool isLeftOut = view.isMinor() && !_query.minorAlerts;
    if (_hasTrips && !isLeftOut && !mattering.empty()) takeTrips(view, isInForce(mattering));
    if (_lines.empty()) return;
    if (isLeftOut) {
      _reading.skipped.add("alert without effect on the service, or about accessibility", alert.id);
      return;
    }
    _reading.periods += published;
    if (isNever) {
      _reading.skipped.add("alert whose periods end before they start", alert.id);
      return;
    }
    if (_incidents.size() == kMostIncidents) {
      _reading.skipped.add("alert after the first 5000 incidents", alert.id);
      return lacks(
          transitLineServiceError(TransitLineServiceError::tooLarge,
                                  "The alerts feed " + _alerts.place() +
                                      " has more incidents on these lines than any network has. Check the address.",
                                  _alerts.place()));
    }
    const auto index = incidentOf(alert, view);
    if (!index) {
      _reading.skipped.add("alert that says nothing", alert.id);
      return;
    }
    Incident& incident = _incidents[*index];
    incident.key = std::min(incident.key, keyOf(alert));
    _quickHashes.pop_back();
    incident.severity = std::max(incident.severity, view.severity);
    for (const auto& [place, isWholeLine] : _lines) {
      Incident::OnLine& onLine = incident.lines[place];
      onLine.periods.insert(onLine.periods.end(), mattering.begin(), mattering.end());
      onLine.isWholeLine = onLine.isWholeLine || isWholeLine;
    }
  }

  void lacks(ErrorRef gap) {
    if (!_gap) _gap = std::move(gap);
  }

  bool isInForce(const std::vector<AlertPeriod>& periods) const {
    return std::any_of(periods.begin(), periods.end(), [&](const AlertPeriod& period) {
      return (!period.start || *period.start <= _query.now) && (!period.end || *period.end >= _query.now);
    });
  }

  static std::string_view routeOf(const EntitySelector& selector) {
    return selector.routeID.empty() ? selector.tripRouteID : selector.routeID;
  }
  static bool isByTripAlone(const EntitySelector& selector) {
    return routeOf(selector).empty() && !selector.tripID.empty();
  }

  void takeSelector(const EntitySelector& selector) {
    ++_reading.selectors;
    // Trips are a table of their own, which only alerts that would be shown are worth.
    if (isByTripAlone(selector) && !_query.countsUnfit)
      _hasTrips = true;
    else if (match(selector) == SelectorFit::tripsMissing)
      _hasTrips = true;
    _hasRoutes = _hasRoutes || !routeOf(selector).empty();
  }

  SelectorFit match(const EntitySelector& selector) {
    const auto take = [&](std::size_t place, bool isWholeLine) {
      bool& flag = _lines[place];
      flag = flag || isWholeLine;
    };
    SelectorFit fit = _matcher.match(selector, take);
    if (fit == SelectorFit::unknownAgency && isOnlyAgencyMeant()) {
      EntitySelector meant = selector;
      meant.agencyID = _feed.agency(0).id;
      fit = _matcher.match(meant, take);
    }
    if (_query.countsUnfit && fit != SelectorFit::lines) _reading.unfit.add(reasonFor(fit), exampleOf(selector));
    return fit;
  }

  /// Whether the static feed's only agency is the one that all selectors name, by another identifier.
  bool isOnlyAgencyMeant() {
    if (!_isOnlyAgencyMeant) {
      _isOnlyAgencyMeant = _feed.agencyCount() == 1;
      std::string_view agency;
      for (const AlertEntity& alert : _alerts.alerts()) {
        if (!*_isOnlyAgencyMeant) break;
        readAlertView(alert.body, [&](const EntitySelector& selector) {
          if (agency.empty()) agency = selector.agencyID;
          if (selector.agencyID.empty() || selector.agencyID != agency) _isOnlyAgencyMeant = false;
        });
      }
    }
    return *_isOnlyAgencyMeant;
  }

  // What follows goes through the selectors again, which few alerts need: there may be millions to remember.

  /// The routes of an alert in force, until one shows that the alerts are about the static feed's lines.
  void takeRoutes(const AlertView& view) {
    if (_knownRoutes.empty()) {
      for (std::size_t i = 0; i < _feed.lineCount(); ++i) _knownRoutes.insert(_feed.line(i).routeID);
      for (const IncidentQuery::Line& line : _query.lines)
        _knownRoutes.insert(line.formerRouteIDs.begin(), line.formerRouteIDs.end());
    }
    readAlertView(view.body, [&](const EntitySelector& selector) {
      const Identifier route(routeOf(selector));
      if (_belongs || route.text().empty()) return;
      _belongs = _knownRoutes.contains(route.text());
      if (_foreignRoutes.size() < kFewestForeignRoutes || _query.isRouteOfOther) _foreignRoutes.emplace(route.text());
    });
  }

  /// The selectors by trip alone, once it is known that their alert would be shown.
  void takeTrips(const AlertView& view, bool isInForce) {
    bool isMissing = _query.countsUnfit;  // else there would be none left
    readAlertView(view.body, [&](const EntitySelector& selector) {
      if (!isMissing && isByTripAlone(selector)) isMissing = match(selector) == SelectorFit::tripsMissing;
    });
    if (isMissing && isInForce && textsOf(view)) lacks(_matcher.tripsError());
  }

  /// Absent for an alert that says nothing. One that breaks off always says something.
  std::optional<AlertTexts> textsOf(const AlertView& view) const {
    auto texts = alertTextsIn(view.body, view.content.effect, _query.language);
    if (!texts && view.isDamaged) texts = alertTextsIn(view.body, AlertEffect::otherEffect, _query.language);
    return texts;
  }

  /// The incident that the alert is, or is one of; absent for one that says nothing. Texts are read once a content.
  std::optional<std::size_t> incidentOf(const AlertEntity& alert, const AlertView& view) {
    const AlertContent& content = view.content;
    const auto [known, isNewContent] = _incidentOfContent.try_emplace(content);
    if (!isNewContent) return known->second;
    auto texts = textsOf(view);
    if (!texts) {
      _incidentOfContent.erase(known);
      return std::nullopt;
    }
    // Texts of one language may agree where those of others differ.
    const auto isSame = [&](const auto& other) {
      const Incident& incident = _incidents[other.second];
      return incident.texts == *texts && incident.cause == content.cause && incident.effect == content.effect;
    };
    const std::size_t hash = contentHash(texts->title) ^ contentHash(texts->description.value_or(""));
    const auto [begin, end] = _incidentsOfTexts.equal_range(hash);
    const auto place = std::find_if(begin, end, isSame);
    known->second = place == end ? _incidents.size() : place->second;
    if (place == end) {
      _incidentsOfTexts.emplace(hash, _incidents.size());
      _incidents.push_back(
          {keyOf(alert), std::move(*texts), {}, content.effect, content.cause, view.severity, AlertConcern::none, {}});
    }
    Incident& incident = _incidents[known->second];
    const std::string detail = content.effectDetail.empty() ? std::string() : effectDetailIn(view.body);
    incident.concern = std::max(incident.concern, concernOf(content.effect, detail));
    // Of alerts that say the same the first one that has an image shows it.
    if (view.hasImage && incident.image == AlertImage()) incident.image = alertImageIn(view.body, _query.language);
    _quickHashesOfContents.insert(content.quickHash());
    return known->second;
  }

  /// Alerts of the same content that concern other lines, or are over, are the same incident: their identifiers count
  /// for its number too.
  void takeLeastKeys() {
    for (const auto& [alert, quickHash] : _quickHashes) {
      if (!_quickHashesOfContents.contains(quickHash)) continue;
      const auto found = _incidentOfContent.find(readAlertView(alert->body, [](const EntitySelector&) {}).content);
      if (found == _incidentOfContent.end()) continue;
      std::string& key = _incidents[found->second].key;
      key = std::min(key, keyOf(*alert));
    }
  }

  /// Takes the texts out of the incident.
  void emit(Incident& incident) {
    AlertIncident::Fields fields;
    fields.muid = incidentMuid(_query.feed, incident.key);
    fields.title = std::move(incident.texts.title);
    fields.summary = std::move(incident.texts.summary);
    fields.fullDescription = std::move(incident.texts.description);
    fields.messageForRoutePlanning = fields.messageForRouteStepping = fields.messageForNonRoutable = fields.title;
    fields.iconType = static_cast<std::int32_t>(incident.effect);
    fields.linkURL = std::move(incident.texts.linkURL);
    fields.effect = incident.effect;
    fields.cause = incident.cause;
    fields.severity = incident.severity;
    fields.concern = incident.concern;
    if (fields.concern == AlertConcern::none && fields.severity == kSeveritySevere)
      fields.concern = AlertConcern::other;
    fields.image = incident.image;
    for (const auto& [place, onLine] : incident.lines)
      fields.affectedEntities.push_back(std::make_shared<const BasicAffectedEntity>(_query.lines[place].muid));
    const auto shared = std::make_shared<const AlertIncident::Fields>(std::move(fields));
    // Lines mostly have the incident in the same periods: they share the objects too.
    std::map<std::tuple<std::optional<Date>, std::optional<Date>, bool>, TransitIncidentRef> made;
    for (const auto& [place, onLine] : incident.lines) {
      const bool isBlocking = incident.effect == AlertEffect::noService && onLine.isWholeLine;
      for (const AlertPeriod& period : periodsThatMatter(joinedPeriods(onLine.periods), _query.now)) {
        TransitIncidentRef& object = made[{period.start, period.end, isBlocking}];
        if (!object) object = std::make_shared<const AlertIncident>(shared, period.start, period.end, isBlocking);
        _incidentsOfLines[place].push_back(object);
      }
    }
  }

  const AlertsFeed& _alerts;
  const StaticFeed& _feed;
  const IncidentQuery& _query;
  SelectorMatcher _matcher;
  ErrorRef _gap;  // the first
  std::vector<TransitIncidents> _incidentsOfLines;
  IncidentReading _reading;
  bool _hasTrips = false;                // the alert at hand has selectors by trip alone that were not matched
  bool _hasRoutes = false;               // the alert at hand names routes
  bool _belongs = false;                 // an alert in force names a route of the static feed
  std::set<std::string> _foreignRoutes;  // named by alerts in force; as many as are asked for
  std::unordered_set<std::string_view> _knownRoutes;
  std::optional<bool> _isOnlyAgencyMeant;  // absent until asked
  std::map<std::size_t, bool> _lines;  // of the alert at hand: place in the query, whether it is about the whole line
  std::vector<std::pair<const AlertEntity*, std::size_t>> _quickHashes;  // of those that are no incident
  std::vector<Incident> _incidents;
  std::unordered_multimap<std::size_t, std::size_t> _incidentsOfTexts;  // by the hash of title and description
  std::unordered_map<AlertContent, std::size_t, AlertContentHash> _incidentOfContent;
  std::unordered_set<std::size_t> _quickHashesOfContents;
};

}  // namespace

IncidentReading readIncidents(const AlertsFeed& alerts, const StaticFeed& feed, const IncidentQuery& query) {
  return IncidentBuilder(alerts, feed, query).build();
}

}  // namespace nimbo
