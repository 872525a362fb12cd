#include "desktop/gtfs/feeds/FeedCheck.h"

#include <algorithm>
#include <set>

#include "desktop/gtfs/alerts/AlertsStore.h"
#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/StaticFeedStore.h"
#include "platform/SystemServices.h"

namespace nimbo {

namespace {

void checkAgainst(const FreshStaticFeed& fresh, const AlertsFeed& alerts, const Feed& feed, const FeedCache& cache,
                  const std::stop_token& stop, FeedCheckReport::Alerts& report) {
  IncidentQuery query;
  query.feed = feed.name;
  query.language = {"", fresh.feed.language()};
  query.minorAlerts = feed.minorAlerts;
  query.now = currentDate();
  query.trips = StaticFeedStore::lookupIn(feed, fresh.trips);
  query.countsUnfit = true;
  if (!feed.siblings.empty())
    query.isRouteOfOther = [&](std::string_view routeID) {
      return std::any_of(feed.siblings.begin(), feed.siblings.end(), [&](const Feed& sibling) {
        const auto held = StaticFeedStore(cache).load(sibling, stop);
        return held && held->feed.hasRoute(routeID);
      });
    };
  for (std::size_t i = 0; i < fresh.feed.lineCount(); ++i)
    query.lines.push_back({static_cast<std::uint32_t>(i), fresh.feed.line(i).muid});
  const IncidentReading reading = readIncidents(alerts, fresh.feed, query);
  std::set<std::uint64_t> incidents;
  for (const Verdict& verdict : reading.verdicts) {
    for (const TransitIncidentRef& incident : verdict.incidents()) incidents.insert(incident->muid());
    report.affectedLines += verdict.isAffected(query.now) ? 1 : 0;
    if (!report.gap) report.gap = verdict.unknownReason();
  }
  report.incidents = incidents.size();
  report.periods = reading.periods;
  report.selectors = reading.selectors;
  report.unfit = reading.unfit;
  report.skipped.add(reading.skipped);
}

}  // namespace

std::vector<ErrorRef> FeedCheckReport::faults() const {
  std::vector<ErrorRef> faults{staticError, alertsError};
  if (alerts) faults.insert(faults.end(), {alerts->staleness, alerts->gap});
  std::erase(faults, nullptr);
  return faults;
}

bool FeedCheckReport::isOtherFeed() const {
  return alertsError && alertsError->code() == static_cast<std::int64_t>(TransitLineServiceError::otherFeed) &&
         alertsError->domain() == kTransitLineServiceErrorDomain;
}

FeedCheckReport checkFeed(const Feed& feed, const FeedCache& cache, const std::stop_token& stop,
                          const FeedCheckProgress& progress) {
  FeedCheckReport report;
  report.name = feed.name;
  const auto fresh = StaticFeedStore(cache).readAnew(feed, stop, progress.receives);
  report.staticError = fresh.error();
  if (fresh)
    report.staticFeed = {fresh->feed.agencyCount(), fresh->feed.lineCount(), fresh->trips.count(),
                         std::string(fresh->feed.language()), fresh->skipped};
  if (progress.beginsAlerts) progress.beginsAlerts();
  AlertsState state;
  const auto fetched = AlertsStore(cache).fetch(feed, state, true, stop);
  report.alertsError = fetched.error();
  if (!fetched) return report;
  const AlertsFeed& alerts = **fetched;
  report.alerts.emplace();
  report.alerts->version = alerts.version();
  report.alerts->timestamp = alerts.timestamp();
  report.alerts->staleness = AlertsStore::staleness(feed, state);
  report.alerts->alerts = alerts.alerts().size();
  report.alerts->skipped = alerts.skipped();
  report.alerts->hasOthers = alerts.hasOthers();
  if (fresh) checkAgainst(*fresh, alerts, feed, cache, stop, *report.alerts);
  return report;
}

}  // namespace nimbo
