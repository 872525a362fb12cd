#include "desktop/gtfs/alerts/AlertsStore.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <ctime>
#include <iomanip>
#include <locale>
#include <sstream>

#include "desktop/gtfs/feeds/OtherContent.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/FileReading.h"
#include "desktop/gtfs/static/StaticFeed.h"
#include "desktop/system/AtomicFile.h"
#include "platform/SystemServices.h"

namespace nimbo {

namespace {

// Lines, then an empty one, then the body: what the file is, the address, ETag, Last-Modified, microseconds since 1970
// of the answer and of the first one with this body, the body's checksum.
constexpr std::string_view kFirstLine = "nimbo-alerts 2";
constexpr std::size_t kLines = 7;
constexpr std::uint64_t kLargestFile = 65 << 20;

template <class T>
std::optional<T> numberIn(std::string_view text) {
  T number{};
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return number;
}

}  // namespace

std::optional<KeptAlerts> KeptAlerts::read(const std::filesystem::path& path, const FeedAddress& address) {
  const auto bytes = readOwnFile(path, kLargestFile);
  if (!bytes) return std::nullopt;
  std::string_view rest = *bytes;
  std::array<std::string_view, kLines> lines;
  for (std::string_view& line : lines) {
    const std::size_t end = rest.find('\n');
    if (end == std::string_view::npos) return std::nullopt;
    line = rest.substr(0, end);
    rest.remove_prefix(end + 1);
  }
  const auto fetchedAt = numberIn<std::int64_t>(lines[4]);
  const auto changedAt = numberIn<std::int64_t>(lines[5]);
  const auto checksum = numberIn<std::uint64_t>(lines[6]);
  if (lines[0] != kFirstLine || lines[1] != address.identity() || !fetchedAt || !changedAt || !checksum ||
      !rest.starts_with('\n'))
    return std::nullopt;
  rest.remove_prefix(1);
  if (flatChecksum(rest) != *checksum) return std::nullopt;
  return KeptAlerts{std::string(lines[1]),
                    {std::string(lines[2]), std::string(lines[3])},
                    Date(std::chrono::microseconds(*fetchedAt)),
                    Date(std::chrono::microseconds(*changedAt)),
                    std::string(rest)};
}

ErrorRef KeptAlerts::write(const std::filesystem::path& path) const {
  std::string bytes(kFirstLine);
  for (const std::string& line :
       {address, validators.etag, validators.lastModified, std::to_string(fetchedAt.time_since_epoch().count()),
        std::to_string(changedAt.time_since_epoch().count()), std::to_string(flatChecksum(body))})
    bytes.append(1, '\n').append(line);
  return writeFileAtomically(path, bytes.append("\n\n").append(body));
}

namespace {

constexpr std::uint64_t kLargestAlerts = 64 << 20;
constexpr std::chrono::seconds kFetchTimeLimit{30};
constexpr TimeInterval kLongestStandIn = 15 * 60;
constexpr TimeInterval kLongestUndated = 7 * 86400;  // of a server whose feed does not say when it was made
constexpr TimeInterval kClockTolerance = 60;  // a little into the future is a clock being set, a lot is a wrong clock

TimeInterval ageOf(Date date) { return -intervalFromNow(date); }

std::string ageText(TimeInterval seconds) {
  const auto minutes = static_cast<long long>(seconds / 60);
  if (minutes == 1) return "1 minute";
  if (minutes < 120) return std::to_string(minutes) + " minutes";
  if (minutes < 2 * 24 * 60) return std::to_string(minutes / 60) + " hours";
  return std::to_string(minutes / (24 * 60)) + " days";
}

/// Absent for a file that counts for ever.
std::optional<TimeInterval> longestAgeOf(const Feed& feed, const AlertsFeed& alerts) {
  const bool isRemote = feed.alerts.isRemote();
  const auto limit = feed.maximumAlertsAge.value_or(isRemote ? kDefaultMaximumAlertsAge : kDefaultMaximumFileAge);
  if (limit.count() == 0) return std::nullopt;
  const auto seconds = static_cast<TimeInterval>(std::chrono::seconds(limit).count());
  return isRemote && !alerts.timestamp() ? std::max(seconds, kLongestUndated) : seconds;
}

/// The date of a Last-Modified field; absent for one that is none. Source: RFC 9110, section 5.6.7.
std::optional<Date> dateOfHTTPText(const std::string& text) {
  std::tm parts{};
  std::istringstream in(text);
  in.imbue(std::locale::classic());
  in >> std::get_time(&parts, "%a, %d %b %Y %H:%M:%S GMT");
  if (in.fail()) return std::nullopt;
  return dateFromUnixTime(static_cast<TimeInterval>(::timegm(&parts)));
}

/// The alerts in a body; `undated` is when they were made where they do not say.
Outcome<FetchedAlerts> readBody(const Feed& feed, std::string body, std::optional<Date> undated) {
  if (ErrorRef error = otherThanAlerts(body, feed.alerts.publicText())) return error;
  auto alerts = AlertsFeed::read(std::move(body), feed.alerts.publicText(), feed.isCombined);
  if (!alerts) return alerts.error();
  const Date date = alerts->timestamp().value_or(undated.value_or(Date()));
  return FetchedAlerts{std::move(*alerts), date};
}

std::optional<Date> undatedOf(const KeptAlerts& kept) {
  return dateOfHTTPText(kept.validators.lastModified).value_or(kept.changedAt);
}

/// Whether an answer that was good once may stand in for one that does not come.
bool canStandIn(const Feed& feed, const KeptAlerts& kept, const FetchedAlerts& alerts) {
  const TimeInterval age = ageOf(kept.fetchedAt);
  return age > -kClockTolerance && age <= kLongestStandIn && !AlertsStore::staleness(feed, alerts);
}

/// Whether the publisher went back. A held stamp that is ahead of the clock was a wrong one.
bool isOlder(const AlertsFeed& alerts, const AlertsFeed& held) {
  return alerts.timestamp() && held.timestamp() && *alerts.timestamp() < *held.timestamp() &&
         *held.timestamp() <= currentDate();
}

void keep(const KeptAlerts& kept, const std::filesystem::path& path) {
  if (const ErrorRef error = kept.write(path)) logCacheFailure(error->reason());
}

}  // namespace

ErrorRef AlertsStore::staleness(const Feed& feed, const FetchedAlerts& alerts) {
  const auto longest = longestAgeOf(feed, alerts.feed);
  const TimeInterval age = ageOf(alerts.madeAt);
  if (!longest || std::abs(age) <= *longest) return nullptr;
  const std::string what = age > 0
                               ? " was last renewed " + ageText(age) + " ago. Try again later"
                               : " is " + ageText(-age) + " ahead of the clock of this machine. Set the clock right";
  return transitLineServiceError(TransitLineServiceError::staleAlerts,
                                 "The alerts feed " + feed.alerts.publicText() + what +
                                     "; where that is its habit, set \"maximumAlertsAgeMinutes\" of feed \"" +
                                     feed.name + "\" in feeds.json.",
                                 feed.alerts.publicText());
}

Outcome<FetchedAlerts> AlertsStore::readLocal(const Feed& feed) const {
  // Before the bytes: a file that is written meanwhile is no younger than it seems.
  const auto changedAt = fileChangeDate(feed.alerts.path());
  auto bytes = readFile(feed.alerts.path(), kLargestAlerts);
  return bytes ? readBody(feed, std::move(*bytes), changedAt) : bytes.error();
}

Outcome<FetchedAlerts> AlertsStore::fetch(const Feed& feed, const std::stop_token& stop) const {
  if (!feed.alerts.isRemote()) return readLocal(feed);
  const std::string place = feed.alerts.publicText();
  const std::filesystem::path path = _cache.alerts(feed.nameOfAlerts());
  auto kept = KeptAlerts::read(path, feed.alerts);
  std::string body;
  const HTTPRequest request{feed.alerts, kept ? kept->validators : HTTPValidators(), kLargestAlerts, kFetchTimeLimit};
  const auto answer = HTTPFetcher::fetch(request, stop, [&](std::string_view piece) {
    body += piece;
    return true;
  });
  if (!answer) return answer.error();
  if (answer->isUnchanged) body = kept->body;
  const bool isSame = kept && body == kept->body;
  KeptAlerts present{feed.alerts.identity(), answer->validators, currentDate(),
                     isSame ? kept->changedAt : currentDate(), std::move(body)};
  auto alerts = readBody(feed, present.body, undatedOf(present));
  if (!alerts) return alerts;
  if (kept && !isSame) {
    const auto held = readBody(feed, std::move(kept->body), undatedOf(*kept));
    if (held && isOlder(alerts->feed, held->feed))
      return transitLineServiceError(TransitLineServiceError::staleAlerts,
                                     "The alerts feed " + place + " went back to an older state. Try again later.",
                                     place);
  }
  keep(present, path);
  return alerts;
}

Outcome<AlertsFeed> AlertsStore::load(const Feed& feed, const std::stop_token& stop) const {
  auto fetched = fetch(feed, stop);
  const ErrorRef error = fetched ? staleness(feed, *fetched) : fetched.error();
  if (!error) return std::move(fetched->feed);
  if (feed.alerts.isRemote() && !fetched) {
    if (auto kept = KeptAlerts::read(_cache.alerts(feed.nameOfAlerts()), feed.alerts)) {
      auto held = readBody(feed, std::move(kept->body), undatedOf(*kept));
      if (held && canStandIn(feed, *kept, *held)) {
        writeLog(kFeedLogFacility, LogLevel::error, "The last alerts of %{private}@ stand in: %{private}@",
                 {feed.name, error->reason()});
        return std::move(held->feed);
      }
    }
  }
  return error;
}

}  // namespace nimbo
