#include "desktop/gtfs/alerts/AlertsStore.h"

#include <array>
#include <charconv>
#include <cmath>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/FileReading.h"
#include "desktop/gtfs/static/StaticFeed.h"
#include "desktop/system/AtomicFile.h"
#include "platform/SystemServices.h"

namespace nimbo {

namespace {

// Lines, then an empty one, then the body: what the file is, the address, ETag, Last-Modified, microseconds since 1970
// of the answer, the body's checksum.
constexpr std::string_view kFirstLine = "nimbo-alerts 1";
constexpr std::size_t kLines = 6;
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
  const auto bytes = readFile(path, kLargestFile);
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
  const auto checksum = numberIn<std::uint64_t>(lines[5]);
  if (lines[0] != kFirstLine || lines[1] != address.text() || !fetchedAt || !checksum || !rest.starts_with('\n'))
    return std::nullopt;
  rest.remove_prefix(1);
  if (flatChecksum(rest) != *checksum) return std::nullopt;
  return KeptAlerts{std::string(lines[1]),
                    {std::string(lines[2]), std::string(lines[3])},
                    Date(std::chrono::microseconds(*fetchedAt)),
                    std::string(rest)};
}

ErrorRef KeptAlerts::write(const std::filesystem::path& path) const {
  std::string bytes(kFirstLine);
  for (const std::string& line :
       {address, validators.etag, validators.lastModified, std::to_string(fetchedAt.time_since_epoch().count()),
        std::to_string(flatChecksum(body))})
    bytes.append(1, '\n').append(line);
  return writeFileAtomically(path, bytes.append("\n\n").append(body));
}

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
