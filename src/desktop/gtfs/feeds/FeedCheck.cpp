#include "desktop/gtfs/feeds/FeedCheck.h"

#include <set>

#include "desktop/gtfs/alerts/AlertsStore.h"
#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/static/StaticFeedStore.h"
#include "platform/SystemServices.h"

namespace nimbo {

namespace {

bool isInForce(const TransitIncident& incident, Date now) {
  const auto start = incident.startDate(), end = incident.endDate();
  return (!start || *start <= now) && (!end || *end >= now);
}

void checkAgainst(const FreshStaticFeed& fresh, const AlertsFeed& alerts, const Feed& feed,
                  FeedCheckReport::Alerts& report) {
  IncidentQuery query;
  query.feed = feed.name;
  query.language = {"", fresh.feed.language()};
  query.minorAlerts = feed.minorAlerts;
  query.now = currentDate();
  query.trips = [&](std::string_view tripID) { return fresh.trips.lineOfTrip(tripID); };
  query.countsUnfit = true;
  for (std::size_t i = 0; i < fresh.feed.lineCount(); ++i)
    query.lines.push_back({static_cast<std::uint32_t>(i), fresh.feed.line(i).muid});
  const IncidentReading reading = readIncidents(alerts, fresh.feed, query);
  std::set<std::uint64_t> incidents;
  for (const TransitIncidents& ofLine : reading.incidents) {
    bool isAffected = false;
    for (const TransitIncidentRef& incident : ofLine) {
      incidents.insert(incident->muid());
      isAffected = isAffected || isInForce(*incident, query.now);
    }
    report.affectedLines += isAffected ? 1 : 0;
  }
  report.incidents = incidents.size();
  report.periods = reading.periods;
  report.selectors = reading.selectors;
  report.unfit = reading.unfit;
  report.skipped.add(reading.skipped);
}

}  // namespace

FeedCheckReport checkFeed(const Feed& feed, const FeedCache& cache, const std::stop_token& stop) {
  FeedCheckReport report;
  report.name = feed.name;
  const auto fresh = StaticFeedStore(cache).readAnew(feed, stop);
  report.staticError = fresh.error();
  if (fresh)
    report.staticFeed = {fresh->feed.agencyCount(), fresh->feed.lineCount(), fresh->trips.count(),
                         std::string(fresh->feed.language()), fresh->skipped};
  const auto alerts = AlertsStore(cache).fetch(feed, stop);
  report.alertsError = alerts.error();
  if (!alerts) return report;
  report.alerts.emplace();
  report.alerts->version = alerts->version();
  report.alerts->timestamp = alerts->timestamp();
  report.alerts->staleness = AlertsStore::staleness(feed, *alerts);
  report.alerts->alerts = alerts->alerts().size();
  report.alerts->skipped = alerts->skipped();
  if (fresh) checkAgainst(*fresh, *alerts, feed, *report.alerts);
  return report;
}

}  // namespace nimbo
