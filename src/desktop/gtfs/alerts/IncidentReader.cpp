#include "desktop/gtfs/alerts/IncidentReader.h"

#include <algorithm>
#include <map>
#include <protozero/exception.hpp>
#include <tuple>
#include <unordered_map>
#include <unordered_set>

#include "desktop/gtfs/alerts/AlertPeriods.h"
#include "desktop/gtfs/alerts/AlertTexts.h"
#include "desktop/gtfs/alerts/AlertView.h"
#include "desktop/gtfs/feeds/FeedMuid.h"

namespace nimbo {

namespace {

constexpr std::size_t kMostIncidents = 5000;  // whole countries have fewer; each costs memory on every line

/// An alert, or several of one content.
struct Incident {
  std::string key;  // the least of its alerts
  AlertTexts texts;
  AlertEffect effect;
  struct OnLine {
    std::vector<AlertPeriod> periods;
    bool isWholeLine = false;
  };
  std::map<std::size_t, OnLine> lines;  // by place in the query
};

/// Title, description, address, cause and effect.
using TextsKey = std::tuple<std::string, std::string, std::string, std::int32_t, AlertEffect>;

struct ContentHash {
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
      : _alerts(alerts), _query(query), _matcher(feed, indicesOf(query), query.trips) {
    _reading.incidents.resize(query.lines.size());
    _sizes.reserve(alerts.alerts().size());
  }

  IncidentReading build() {
    for (const AlertEntity& alert : _alerts.alerts()) {
      try {
        take(alert);
      } catch (const protozero::exception&) {
        _reading.skipped.add("alert that is damaged", alert.id);
      }
    }
    if (!_incidents.empty()) takeLeastKeys();
    for (const Incident& incident : _incidents) emit(incident);
    return std::move(_reading);
  }

 private:
  static std::vector<std::uint32_t> indicesOf(const IncidentQuery& query) {
    std::vector<std::uint32_t> indices;
    for (const IncidentQuery::Line& line : query.lines) indices.push_back(line.index);
    return indices;
  }

  /// The identifier; where alerts share one, with the content, since the number may not depend on positions.
  static std::string keyOf(const AlertEntity& alert) {
    std::string key(alert.id);
    if (alert.isRepeated) key.append(1, '\0').append(std::to_string(hashOfBytes(alert.body)));
    return key;
  }

  void take(const AlertEntity& alert) {
    _lines.clear();
    const AlertView view = readAlertView(alert.body, [&](const EntitySelector& selector) { takeSelector(selector); });
    _sizes.emplace_back(&alert, view.content.sizeHash());
    if (_lines.empty()) return;
    if (view.isMinor() && !_query.minorAlerts) {
      _reading.skipped.add("alert without effect on the service, or about accessibility", alert.id);
      return;
    }
    AlertPeriods periods = alertPeriodsIn(alert.body);
    _reading.periods += periods.published;
    if (periods.periods.empty()) {
      _reading.skipped.add("alert whose periods end before they start", alert.id);
      return;
    }
    // Before each line gets its copy: an alert may have millions.
    const auto mattering = periodsThatMatter(joinedPeriods(std::move(periods.periods)), _query.now);
    if (_incidents.size() == kMostIncidents) {
      _reading.isCutShort = true;
      _reading.skipped.add("alert after the first 5000 incidents", alert.id);
      return;
    }
    const auto index = incidentOf(alert, view.content);
    if (!index) {
      _reading.skipped.add("alert that says nothing", alert.id);
      return;
    }
    Incident& incident = _incidents[*index];
    for (const auto& [place, isWholeLine] : _lines) {
      Incident::OnLine& onLine = incident.lines[place];
      onLine.periods.insert(onLine.periods.end(), mattering.begin(), mattering.end());
      onLine.isWholeLine = onLine.isWholeLine || isWholeLine;
    }
  }

  void takeSelector(const EntitySelector& selector) {
    ++_reading.selectors;
    const SelectorFit fit = _matcher.match(selector, [&](std::size_t place, bool isWholeLine) {
      bool& flag = _lines[place];
      flag = flag || isWholeLine;
    });
    if (_query.countsUnfit && fit != SelectorFit::lines) _reading.unfit.add(reasonFor(fit), exampleOf(selector));
  }

  /// The incident that the alert is, or is one of; absent for one that says nothing. Texts are read once a content.
  std::optional<std::size_t> incidentOf(const AlertEntity& alert, const AlertContent& content) {
    if (const auto known = _incidentOfContent.find(content); known != _incidentOfContent.end()) return known->second;
    const auto texts = alertTextsIn(alert.body, content.effect, _query.language);
    if (!texts) return std::nullopt;
    // Texts of one language may agree where those of others differ.
    const auto [place, isNew] = _incidentOfTexts.try_emplace(
        {texts->title, texts->description.value_or(""), texts->linkURL.value_or(""), content.cause, content.effect},
        _incidents.size());
    if (isNew) _incidents.push_back({keyOf(alert), *texts, content.effect, {}});
    _incidentOfContent.emplace(content, place->second);
    _sizesOfContents.insert(content.sizeHash());
    return place->second;
  }

  /// Alerts of the same content that concern other lines, or are over, are the same incident: their identifiers count
  /// for its number too.
  void takeLeastKeys() {
    for (const auto& [alert, size] : _sizes) {
      if (!_sizesOfContents.contains(size)) continue;
      const auto found = _incidentOfContent.find(readAlertView(alert->body, [](const EntitySelector&) {}).content);
      if (found == _incidentOfContent.end()) continue;
      std::string& key = _incidents[found->second].key;
      key = std::min(key, keyOf(*alert));
    }
  }

  void emit(const Incident& incident) {
    AlertIncident::Fields fields;
    fields.muid = incidentMuid(_query.feed, incident.key);
    fields.title = incident.texts.title;
    fields.summary = incident.texts.summary;
    fields.fullDescription = incident.texts.description;
    fields.messageForRoutePlanning = fields.messageForRouteStepping = fields.messageForNonRoutable = fields.title;
    fields.iconType = static_cast<std::int32_t>(incident.effect);
    fields.linkURL = incident.texts.linkURL;
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
        _reading.incidents[place].push_back(object);
      }
    }
  }

  const AlertsFeed& _alerts;
  const IncidentQuery& _query;
  SelectorMatcher _matcher;
  IncidentReading _reading;
  std::map<std::size_t, bool> _lines;  // of the alert at hand: place in the query, whether it is about the whole line
  std::vector<std::pair<const AlertEntity*, std::size_t>> _sizes;  // `sizeHash` of all alerts
  std::vector<Incident> _incidents;
  std::map<TextsKey, std::size_t> _incidentOfTexts;
  std::unordered_map<AlertContent, std::size_t, ContentHash> _incidentOfContent;
  std::unordered_set<std::size_t> _sizesOfContents;  // by `sizeHash`
};

}  // namespace

IncidentReading readIncidents(const AlertsFeed& alerts, const StaticFeed& feed, const IncidentQuery& query) {
  return IncidentBuilder(alerts, feed, query).build();
}

}  // namespace nimbo
