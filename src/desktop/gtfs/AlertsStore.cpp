#include "desktop/gtfs/AlertsStore.h"

#include <cmath>

#include "desktop/gtfs/FeedLog.h"
#include "desktop/gtfs/FileReading.h"
#include "desktop/gtfs/KeptAlerts.h"
#include "desktop/gtfs/TransitLineServiceError.h"
#include "platform/Clock.h"

namespace nimbo {

namespace {

constexpr std::uint64_t kLargestAlerts = 64 << 20;
constexpr std::chrono::seconds kFetchTimeLimit{30};
constexpr TimeInterval kLongestStandIn = 15 * 60;
constexpr TimeInterval kClockTolerance = 60;  // a little into the future is a clock being set, a lot is a wrong clock

TimeInterval ageOf(Date date) { return -intervalFromNow(date); }

std::string ageText(TimeInterval seconds) {
  const auto minutes = static_cast<long long>(seconds / 60);
  if (minutes == 1) return "1 minute";
  if (minutes < 120) return std::to_string(minutes) + " minutes";
  if (minutes < 2 * 24 * 60) return std::to_string(minutes / 60) + " hours";
  return std::to_string(minutes / (24 * 60)) + " days";
}

/// Whether an answer that was good once may stand in for one that does not come.
bool canStandIn(const Feed& feed, const KeptAlerts& kept, const AlertsFeed& alerts) {
  const TimeInterval age = ageOf(kept.fetchedAt);
  return age > -kClockTolerance && age <= kLongestStandIn && !AlertsStore::staleness(feed, alerts);
}

void keep(const KeptAlerts& kept, const std::filesystem::path& path) {
  if (const ErrorRef error = kept.write(path)) logCacheFailure(error->reason());
}

}  // namespace

ErrorRef AlertsStore::staleness(const Feed& feed, const AlertsFeed& alerts) {
  if (!feed.alerts.isRemote() || !alerts.timestamp()) return nullptr;
  const TimeInterval age = ageOf(*alerts.timestamp());
  if (std::abs(age) <= static_cast<TimeInterval>(std::chrono::seconds(feed.maximumAlertsAge).count())) return nullptr;
  const std::string what = age > 0
                               ? " was last renewed by its publisher " + ageText(age) + " ago. Try again later"
                               : " is " + ageText(-age) + " ahead of the clock of this machine. Set the clock right";
  return transitLineServiceError(TransitLineServiceError::staleAlerts,
                                 "The alerts feed " + feed.alerts.publicText() + what +
                                     "; where that is its habit, set \"maximumAlertsAgeMinutes\" of feed \"" +
                                     feed.name + "\" in feeds.json.",
                                 feed.alerts.publicText());
}

Outcome<AlertsFeed> AlertsStore::fetch(const Feed& feed, const std::stop_token& stop) const {
  const std::string place = feed.alerts.publicText();
  if (!feed.alerts.isRemote()) {
    auto bytes = readFile(feed.alerts.path(), kLargestAlerts);
    return bytes ? AlertsFeed::read(std::move(*bytes), place) : bytes.error();
  }
  const std::filesystem::path path = _cache.alerts(feed.name);
  auto kept = KeptAlerts::read(path, feed.alerts);
  std::string body;
  const HTTPRequest request{feed.alerts, kept ? kept->validators : HTTPValidators(), kLargestAlerts, kFetchTimeLimit};
  const auto answer = HTTPFetcher::fetch(request, stop, [&](std::string_view piece) {
    body += piece;
    return true;
  });
  if (!answer) return answer.error();
  if (answer->isUnchanged) body = kept->body;
  auto alerts = AlertsFeed::read(body, place);
  if (!alerts) return alerts;
  if (kept && !answer->isUnchanged) {
    const auto held = AlertsFeed::read(std::move(kept->body), place);
    if (held && canStandIn(feed, *kept, *held) && alerts->timestamp() < held->timestamp())
      return transitLineServiceError(TransitLineServiceError::staleAlerts,
                                     "The alerts feed " + place + " went back to an older state. Try again later.",
                                     place);
  }
  keep({feed.alerts.text(), answer->validators, currentDate(), std::move(body)}, path);
  return alerts;
}

Outcome<AlertsFeed> AlertsStore::load(const Feed& feed, const std::stop_token& stop) const {
  auto fetched = fetch(feed, stop);
  ErrorRef error = fetched ? staleness(feed, *fetched) : fetched.error();
  if (!error || !feed.alerts.isRemote()) return fetched;
  if (!fetched) {
    if (auto kept = KeptAlerts::read(_cache.alerts(feed.name), feed.alerts)) {
      auto held = AlertsFeed::read(std::move(kept->body), feed.alerts.publicText());
      if (held && canStandIn(feed, *kept, *held)) {
        writeLog(kFeedLogFacility, LogLevel::error, "The last alerts of %{private}@ stand in: %{private}@",
                 {feed.name, error->reason()});
        return held;
      }
    }
  }
  return error;
}

}  // namespace nimbo
