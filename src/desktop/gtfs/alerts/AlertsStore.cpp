#include "desktop/gtfs/alerts/AlertsStore.h"

#include <fcntl.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>

#include "desktop/gtfs/ContentHash.h"
#include "desktop/gtfs/feeds/OtherContent.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/FileReading.h"
#include "desktop/gtfs/net/ServerWishes.h"
#include "desktop/system/AtomicFile.h"
#include "desktop/system/SmallMemory.h"
#include "platform/SystemServices.h"

namespace nimbo {

namespace {

// Lines, then an empty one, then the body: what the file is, the address, ETag, Last-Modified, microseconds since 1970
// of the first answer with this body and of the publisher's timestamp, which may be empty, the body's checksum. When
// the last answer with it came is the file's own time.
constexpr std::string_view kFirstLine = "nimbo-alerts 4";
constexpr std::size_t kLines = 7;
constexpr std::uint64_t kLargestFile = 65 << 20;

template <class T>
std::optional<T> numberIn(std::string_view text) {
  T number{};
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return number;
}

constexpr std::uint64_t kLargestAlerts = 64 << 20;
constexpr std::chrono::seconds kFetchTimeLimit{30};
constexpr TimeInterval kLongestStandIn = 15 * 60;
constexpr TimeInterval kShortestBetweenWritings = 10 * 60;  // feeds of some publishers differ each time
constexpr TimeInterval kLongestUndated = 7 * 86400;         // of a server whose feed does not say when it was made
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
std::optional<TimeInterval> longestAgeOf(const Feed& feed, const AlertsState& state) {
  const bool isRemote = feed.alerts.isRemote();
  const auto limit = feed.maximumAlertsAge.value_or(isRemote ? kDefaultMaximumAlertsAge : kDefaultMaximumFileAge);
  if (limit.count() == 0) return std::nullopt;
  const auto seconds = static_cast<TimeInterval>(std::chrono::seconds(limit).count());
  return isRemote && !state.timestamp ? std::max(seconds, kLongestUndated) : seconds;
}

Outcome<AlertsFeed> readBody(const Feed& feed, std::string body) {
  const std::string place = feed.alerts.publicText(), beginning = body.substr(0, kTellingBytes);
  auto alerts = AlertsFeed::read(std::move(body), place, feed.isCombined);
  // Only of what is no feed: the first bytes of one may look like a page's.
  if (!alerts)
    if (ErrorRef other = otherThanAlerts(beginning, place)) return other;
  return alerts;
}

Date dateOf(const AlertsState& state) {
  return state.timestamp.value_or(dateOfHTTPText(state.validators.lastModified).value_or(state.changedAt));
}

/// Whether the publisher went back. A held stamp that is ahead of the clock was a wrong one.
bool isOlder(const std::optional<Date>& timestamp, const std::optional<Date>& held) {
  return timestamp && held && *timestamp < *held && *held <= currentDate();
}

std::optional<Date> dateIn(std::string_view text) {
  const auto number = numberIn<std::int64_t>(text);
  return number ? std::optional(Date(std::chrono::microseconds(*number))) : std::nullopt;
}
std::string textOf(Date date) { return std::to_string(date.time_since_epoch().count()); }

/// An answer in the cache.
struct KeptAlerts {
  AlertsState state;
  std::string body;
};

/// Absent when there is none, or it is damaged, of another address, another version or another user.
std::optional<KeptAlerts> readKept(const std::filesystem::path& path, const Feed& feed) {
  // Before the bytes: a file that is written meanwhile is no younger than it seems.
  std::string file = fileFingerprint(path);
  const auto fetchedAt = fileChangeDate(path);
  const auto bytes = readOwnFile(path, kLargestFile);
  if (!bytes || !fetchedAt) return std::nullopt;
  std::string_view rest = *bytes;
  std::array<std::string_view, kLines> lines;
  for (std::string_view& line : lines) {
    const std::size_t end = rest.find('\n');
    if (end == std::string_view::npos) return std::nullopt;
    line = rest.substr(0, end);
    rest.remove_prefix(end + 1);
  }
  const auto changedAt = dateIn(lines[4]), timestamp = dateIn(lines[5]);
  const auto checksum = numberIn<std::uint64_t>(lines[6]);
  if (lines[0] != kFirstLine || lines[1] != feed.alerts.identity() || !changedAt || !checksum ||
      !rest.starts_with('\n'))
    return std::nullopt;
  rest.remove_prefix(1);
  if (contentHash(rest) != *checksum) return std::nullopt;
  KeptAlerts kept{{.feed = feed,
                   .hash = *checksum,
                   .size = rest.size(),
                   .validators = {std::string(lines[2]), std::string(lines[3])},
                   .timestamp = timestamp,
                   .fetchedAt = *fetchedAt,
                   .changedAt = *changedAt,
                   .file = std::move(file)},
                  std::string(rest)};
  return kept;
}

/// Lets the file at `path` be as old as the answer in it, unless another process has put another answer there.
void confirm(const std::filesystem::path& path, AlertsState& state) {
  if (fileFingerprint(path) != state.file)
    if (const auto other = readKept(path, *state.feed); !other || other->state.hash != state.hash)
      return state.file.clear();
  if (const ErrorRef error = setFileChangeDate(path, state.fetchedAt)) logCacheFailure(error->reason());
  state.file = fileFingerprint(path);
}

/// Keeps a date as the time of an empty file; one that is over needs none.
void keepDate(const std::filesystem::path& path, std::optional<Date> date) {
  if (const auto kept = fileChangeDate(path); !date && (!kept || *kept <= currentDate())) return;
  if (const ErrorRef error = makeFolders(path.parent_path())) return logCacheFailure(error->reason());
  const FileDescriptor file(::open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK, 0600));
  if (const ErrorRef error = setFileChangeDate(path, date.value_or(currentDate()))) logCacheFailure(error->reason());
}

/// A date that was kept and is to come, in no more than `longest` seconds: a clock that was set back holds nothing up.
std::optional<Date> keptDate(const std::filesystem::path& path, TimeInterval longest) {
  const auto date = fileChangeDate(path);
  const TimeInterval wait = date ? intervalFromNow(*date) : 0;
  return wait > 0 && wait <= longest ? date : std::nullopt;
}

ErrorRef waitsForServer(const Feed& feed, Date until) {
  return transitLineServiceError(TransitLineServiceError::serverFailure,
                                 "Cannot fetch " + feed.alerts.publicText() +
                                     ": its server does not want to be asked before " +
                                     ageText(std::ceil(intervalFromNow(until) / 60) * 60) + " have passed.",
                                 feed.alerts.publicText());
}

}  // namespace

void AlertsStore::write(const std::filesystem::path& path, AlertsState& state, const std::string& body) const {
  const TimeInterval age = ageOf(state.writtenAt);
  if (age >= 0 && age < kShortestBetweenWritings && !(_users && _users->hasOthers())) return;
  std::string bytes(kFirstLine);
  for (const std::string& line :
       {state.feed->alerts.identity(), state.validators.etag, state.validators.lastModified, textOf(state.changedAt),
        state.timestamp ? textOf(*state.timestamp) : std::string(), std::to_string(state.hash)})
    bytes.append(1, '\n').append(line);
  state.writtenAt = state.fetchedAt;
  if (const ErrorRef error = writeFileAtomically(path, bytes.append("\n\n").append(body)))
    return logCacheFailure(error->reason());
  state.file = fileFingerprint(path);
  confirm(path, state);
}

ErrorRef AlertsStore::staleness(const Feed& feed, const AlertsState& state) {
  const auto longest = longestAgeOf(feed, state);
  const TimeInterval age = ageOf(state.madeAt);
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

Outcome<std::optional<AlertsFeed>> AlertsStore::fetchLocal(const Feed& feed, AlertsState& state, bool needsFeed) const {
  // Before the bytes: a file that is written meanwhile is no younger than it seems.
  const auto changedAt = fileChangeDate(feed.alerts.path());
  auto bytes = readFile(feed.alerts.path(), kLargestAlerts);
  if (!bytes) return bytes.error();
  const std::uint64_t hash = contentHash(*bytes);
  std::optional<AlertsFeed> alerts;
  if (needsFeed || hash != state.hash) {
    auto read = readBody(feed, std::move(*bytes));
    if (!read) return read.error();
    alerts = std::move(*read);
    state.feed = feed;
    state.hash = hash;
    state.timestamp = alerts->timestamp();
  }
  state.madeAt = state.timestamp.value_or(changedAt.value_or(Date()));
  return alerts;
}

Outcome<std::optional<AlertsFeed>> AlertsStore::fetchRemote(const Feed& feed, AlertsState& state, bool needsFeed,
                                                            const std::stop_token& stop) const {
  const std::filesystem::path path = _cache.alerts(feed.nameOfAlerts());
  std::optional<KeptAlerts> kept;
  if (needsFeed) kept = readKept(path, feed);
  if (kept && !state.feed) state = kept->state;
  // A server may leave out what is held, or not needed.
  const HTTPValidators known = !needsFeed ? state.validators : kept ? kept->state.validators : HTTPValidators();
  if (const auto retryAt = keptDate(_cache.retryAt(feed.alerts.identity()), kLongestRetryAfter))
    return waitsForServer(feed, *retryAt);
  std::string body;
  HTTPWishes wishes;
  const auto reserve = [&](std::uint64_t size) { body.reserve(std::min(size, kLargestAlerts)); };
  const auto answer = HTTPFetcher::fetch({feed.alerts, known, kLargestAlerts, kFetchTimeLimit, &wishes, reserve}, stop,
                                         [&](std::string_view piece) {
                                           if (body.empty()) {
                                             // The next answer is mostly as large, and growing copies all of it.
                                             if (body.capacity() < state.size)
                                               body.reserve(state.size + state.size / 16);
                                             populate(body.data(), std::min(state.size, body.capacity()));
                                           }
                                           body += piece;
                                           return true;
                                         });
  if (!answer) {
    keepDate(_cache.retryAt(feed.alerts.identity()), retryDateOf(wishes, currentDate()));
    return answer.error();
  }
  const bool isKept = kept && (answer->isUnchanged || body == kept->body);
  if (isKept) body = std::move(kept->body);
  const std::uint64_t hash = isKept                              ? kept->state.hash
                             : answer->isUnchanged && !needsFeed ? state.hash
                                                                 : contentHash(body);
  const bool isSame = state.feed && hash == state.hash;
  std::optional<AlertsFeed> alerts;
  if (needsFeed || !isSame) {
    auto read = readBody(feed, std::move(body));
    if (!read) return read.error();
    if (isOlder(read->timestamp(), state.timestamp))
      return transitLineServiceError(
          TransitLineServiceError::staleAlerts,
          "The alerts feed " + feed.alerts.publicText() + " went back to an older state. Try again later.",
          feed.alerts.publicText());
    alerts = std::move(*read);
    state.timestamp = alerts->timestamp();
    state.size = alerts->bytes().size();
  }
  state.feed = feed;
  state.hash = hash;
  state.validators = answer->validators;
  state.fetchedAt = currentDate();
  if (!isSame) state.changedAt = isKept ? kept->state.changedAt : state.fetchedAt;
  state.madeAt = dateOf(state);
  const TimeInterval freshness = freshnessOf(wishes);
  keepDate(_cache.freshUntil(feed.alerts.identity()),
           freshness > 0 ? std::optional(dateByAdding(state.fetchedAt, freshness)) : std::nullopt);
  if (isKept)
    state.file = kept->state.file;
  else if (!isSame)
    state.file.clear();
  if (!state.file.empty())
    confirm(path, state);
  else if (alerts)
    write(path, state, alerts->bytes());
  return alerts;
}

Outcome<std::optional<AlertsFeed>> AlertsStore::fetch(const Feed& feed, AlertsState& state, bool needsFeed,
                                                      const std::stop_token& stop) const {
  if (state.feed && state.feed != feed) state = {};
  needsFeed = needsFeed || !state.feed;
  return feed.alerts.isRemote() ? fetchRemote(feed, state, needsFeed, stop) : fetchLocal(feed, state, needsFeed);
}

Outcome<std::optional<AlertsFeed>> AlertsStore::lastAnswer(const Feed& feed, AlertsState& state, bool needsFeed,
                                                           const ErrorRef& failure) const {
  const TimeInterval age = ageOf(state.fetchedAt);
  state.madeAt = dateOf(state);
  if (!state.feed || age <= -kClockTolerance || age > kLongestStandIn || staleness(feed, state)) return failure;
  std::optional<AlertsFeed> alerts;
  if (needsFeed) {
    auto kept = readKept(_cache.alerts(feed.nameOfAlerts()), feed);
    if (!kept || kept->state.hash != state.hash) return failure;
    auto read = readBody(feed, std::move(kept->body));
    if (!read) return failure;
    alerts = std::move(*read);
  }
  writeLog(kFeedLogFacility, LogLevel::error, "The last alerts of %{private}@ stand in: %{private}@",
           {feed.name, failure->reason()});
  return alerts;
}

bool AlertsStore::takeShared(const Feed& feed, AlertsState& state, bool needsFeed, Date notBefore,
                             std::optional<AlertsFeed>& alerts) const {
  if (notBefore == kNow) return false;
  const std::filesystem::path path = _cache.alerts(feed.nameOfAlerts());
  const bool servesStill = keptDate(_cache.freshUntil(feed.alerts.identity()), kLongestFreshness).has_value();
  const auto serves = [&](Date answered) {
    const TimeInterval age = ageOf(answered);
    return age >= 0 && ((age <= kLongestStandIn && answered >= notBefore) || (servesStill && age <= kLongestFreshness));
  };
  std::optional<KeptAlerts> kept;
  const auto written = fileChangeDate(path);
  // The answer in the file is another process's, or wanted whole.
  if (written && serves(*written) && (needsFeed || !state.feed || fileFingerprint(path) != state.file))
    kept = readKept(path, feed);
  const bool isSame = kept && state.feed && kept->state.hash == state.hash;
  if (kept && state.feed && !isSame &&
      (kept->state.fetchedAt < state.fetchedAt || isOlder(kept->state.timestamp, state.timestamp)))
    kept.reset();
  if (kept) {
    AlertsState& found = kept->state;
    if (needsFeed || !isSame) {
      auto read = readBody(feed, std::move(kept->body));
      if (!read) return false;
      alerts = std::move(*read);
    }
    found.writtenAt = state.writtenAt;
    found.madeAt = dateOf(found);
    if (staleness(feed, found)) return false;
    state = std::move(found);
    return true;
  }
  return !needsFeed && state.feed && serves(state.fetchedAt) && !staleness(feed, state);
}

Outcome<std::optional<AlertsFeed>> AlertsStore::load(const Feed& feed, AlertsState& state, bool needsFeed,
                                                     const std::stop_token& stop, Date notBefore) const {
  if (state.feed && state.feed != feed) state = {};
  if (feed.alerts.isRemote()) {
    if (_users) _users->join();
    std::optional<AlertsFeed> alerts;
    state.isShared = takeShared(feed, state, needsFeed, notBefore, alerts);
    if (state.isShared) return alerts;
  }
  auto fetched = fetch(feed, state, needsFeed, stop);
  if (!fetched) return feed.alerts.isRemote() ? lastAnswer(feed, state, needsFeed, fetched.error()) : fetched;
  if (ErrorRef error = staleness(feed, state)) return error;
  return fetched;
}

}  // namespace nimbo
