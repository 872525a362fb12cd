#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "desktop/gtfs/alerts/AlertConcern.h"
#include "desktop/gtfs/alerts/AlertTexts.h"
#include "desktop/gtfs/alerts/AlertsFeed.h"
#include "desktop/gtfs/alerts/RealtimeFields.h"
#include "desktop/gtfs/alerts/SelectorMatcher.h"
#include "desktop/gtfs/alerts/Verdict.h"
#include "desktop/gtfs/feeds/SkipReport.h"
#include "desktop/gtfs/text/Translation.h"
#include "platform/transit/TransitIncident.h"

namespace nimbo {

/// One period of an alert as an incident. Alerts come with hundreds of periods: all of one alert share its texts.
class AlertIncident final : public FieldsTransitIncident {
 public:
  struct Fields : TransitIncidentFields {
    AlertEffect effect = AlertEffect::unknownEffect;
    std::int32_t cause = kUnknownCause;
    std::int32_t severity = kUnknownSeverity;
    /// Never none where it is severe.
    AlertConcern concern = AlertConcern::other;
    AlertImage image;
  };

  /// `alert` is not null; its dates and its blocking flag play no part.
  AlertIncident(std::shared_ptr<const Fields> alert, std::optional<Date> startDate, std::optional<Date> endDate,
                bool isBlocking)
      : _alert(std::move(alert)), _startDate(startDate), _endDate(endDate), _isBlocking(isBlocking) {}

  const Fields& fields() const override { return *_alert; }
  std::optional<Date> startDate() const override { return _startDate; }
  std::optional<Date> endDate() const override { return _endDate; }
  bool isBlockingIncident() const override { return _isBlocking; }
  std::string_view className() const override { return "AlertIncident"; }

 private:
  std::shared_ptr<const Fields> _alert;
  std::optional<Date> _startDate;
  std::optional<Date> _endDate;
  bool _isBlocking;
};

/// What is asked of a feed's alerts.
struct IncidentQuery {
  /// A line whose incidents are wanted.
  struct Line {
    std::uint32_t index;  ///< in the static feed; once in the query
    std::uint64_t muid;   ///< the number under which incidents name it
    /// Identifiers that the line had before, which no line of the static feed has now: alerts may still name them.
    std::vector<std::string> formerRouteIDs = {};
  };

  std::string feed;  ///< the feed's name
  std::vector<Line> lines;
  LanguagePreference language;
  bool minorAlerts = false;  ///< whether alerts that change nothing for most riders count
  Date now;
  SelectorMatcher::TripLookup trips;
  /// Whether another static feed that is read by the same alerts has a route; none where there is no such feed.
  std::function<bool(std::string_view routeID)> isRouteOfOther = {};
  bool countsUnfit = false;  ///< whether selectors that fit none of the lines are reported; for all lines of a feed
};

/// The alerts of a feed as incidents of lines, and what was found on the way.
struct IncidentReading {
  /// For each line of the query; incidents in the feed's order and then by date. Unknown, all of them, where alerts
  /// break off before they say what they are about, need trips that cannot be had, belong to another static feed, or
  /// are more than any network has.
  std::vector<Verdict> verdicts;
  /// Until then, from the query's `now` on, the same alerts make the same verdicts.
  Date holdsUntil = Date::max();
  std::size_t periods = 0;    ///< published ones of the alerts that concern the lines
  std::size_t selectors = 0;  ///< of all alerts
  SkipReport skipped;         ///< alerts that make no incident, by reason
  SkipReport unfit;           ///< selectors that fit no line, by reason
};

/// Turns alerts into verdicts on the lines asked for; other alerts are only looked at. Alerts of one content
/// (texts, address, cause, effect) are one incident, with one number, on the lines of all of them: each line has it in
/// the periods of the alerts that name the line. The number is made from the least of their identifiers, those of
/// other lines among them, so that it does not depend on what is asked for, and stays when a text changes. Of alerts
/// that say the same in the chosen language alone, those of other lines do not count: reading the texts of them all
/// would take twice the time.
IncidentReading readIncidents(const AlertsFeed& alerts, const StaticFeed& feed, const IncidentQuery& query);

}  // namespace nimbo
