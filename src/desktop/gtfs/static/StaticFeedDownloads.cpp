#include "desktop/gtfs/static/StaticFeedDownloads.h"

#include <algorithm>
#include <condition_variable>
#include <cstdio>
#include <system_error>
#include <thread>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/FileReading.h"
#include "desktop/system/AtomicFile.h"
#include "platform/SystemServices.h"

namespace nimbo {

namespace {

constexpr TimeInterval kFirstWait = 15 * 60;
constexpr TimeInterval kLongestWait = 86400;
constexpr int kMostAttempts = 30;
constexpr std::uint64_t kLargestAttemptsFile = 100;

/// Attempts in vain, in a row.
struct Attempts {
  int count = 0;
  Date last;
};

Attempts readAttempts(const std::filesystem::path& path) {
  const auto bytes = readOwnFile(path, kLargestAttemptsFile);
  Attempts attempts;
  double seconds = 0;
  if (!bytes || std::sscanf(bytes->c_str(), "%d %lf", &attempts.count, &seconds) != 2) return {};
  attempts.count = std::clamp(attempts.count, 0, kMostAttempts);
  attempts.last = dateFromUnixTime(seconds);
  return attempts;
}

void writeAttempts(const std::filesystem::path& path, int count) {
  const std::string text =
      std::to_string(count) + " " + std::to_string(intervalBetween(dateFromUnixTime(0), currentDate())) + "\n";
  if (const ErrorRef error = writeFileAtomically(path, text)) logCacheFailure(error->reason());
}

ErrorRef downloading(const std::string& feed, std::uint64_t received) {
  const std::string size = std::to_string(received >> 20) + " MiB";
  return transitLineServiceError(TransitLineServiceError::downloading,
                                 "The static feed of \"" + feed + "\" is still being downloaded: " + size +
                                     " have come. It goes on; look again in a minute.",
                                 feed + " (" + size + ")");
}

}  // namespace

struct StaticFeedDownloads::Download {
  Download(Feed feedToLoad, bool feedIsHeld) : feed(std::move(feedToLoad)), isHeld(feedIsHeld) {}

  void run(const StaticFeedStore& store, const FeedCache& cache, const std::stop_token& stop) noexcept;

  const Feed feed;
  const bool isHeld;  // in the cache
  std::mutex lock;
  std::condition_variable_any changed;
  std::optional<Outcome<LoadedStaticFeed>> result;
  std::uint64_t received = 0;           // bytes
  std::optional<std::uint64_t> length;  // bytes, where the server says
  std::jthread thread;                  // last: it ends before the rest goes
};

void StaticFeedDownloads::Download::run(const StaticFeedStore& store, const FeedCache& cache,
                                        const std::stop_token& stop) noexcept {
  std::optional<Outcome<LoadedStaticFeed>> outcome;
  try {
    // It counts as one in vain until it is over: the process may end before.
    const std::filesystem::path attempts = cache.attempts(feed.name);
    if (isHeld) writeAttempts(attempts, readAttempts(attempts).count + 1);
    outcome = store.load(feed, stop, [this](std::uint64_t bytes, std::optional<std::uint64_t> all) {
      const std::lock_guard guard(lock);
      received = bytes;
      length = all;
    });
    if (const auto now = store.held(feed, stop); now && !now->isDue) {
      std::error_code ignored;
      std::filesystem::remove(attempts, ignored);
    }
    if (!*outcome)
      writeLog(kFeedLogFacility, LogLevel::error, "The static feed of %{private}@ has not come: %{private}@",
               {feed.name, outcome->error()->reason()});
  } catch (const std::exception& exception) {
    outcome.emplace(transitLineServiceError(
        TransitLineServiceError::internal,
        "Loading the static feed of \"" + feed.name + "\" failed: " + exception.what() + ".", feed.name));
  }
  const std::lock_guard guard(lock);
  result = std::move(outcome);
  changed.notify_all();
}

StaticFeedDownloads::~StaticFeedDownloads() {
  for (const auto& [name, download] : _downloads) download->thread.request_stop();
}

std::shared_ptr<StaticFeedDownloads::Download> StaticFeedDownloads::join(const Feed& feed, bool isHeld) {
  const std::lock_guard guard(_lock);
  std::shared_ptr<Download>& download = _downloads[feed.name];
  // One that ended with the feed while nobody waited is as good as one that is asked for now.
  if (download && download->feed == feed) {
    const std::lock_guard downloadGuard(download->lock);
    if (!download->result || (!isHeld && *download->result)) return download;
  }
  auto next = std::make_shared<Download>(feed, isHeld);
  next->thread = std::jthread(
      [&to = *next, store = _store, cache = _cache](const std::stop_token& stop) { to.run(store, cache, stop); });
  if (download) download->thread.request_stop();
  return download = std::move(next);
}

void StaticFeedDownloads::dropFinished(const Feed& feed) {
  const std::lock_guard guard(_lock);
  const auto found = _downloads.find(feed.name);
  if (found == _downloads.end()) return;
  std::unique_lock downloadGuard(found->second->lock);
  const bool isFinished = found->second->result.has_value();
  downloadGuard.unlock();
  if (isFinished) _downloads.erase(found);
}

bool StaticFeedDownloads::mayAsk(const Feed& feed) const {
  const Attempts attempts = readAttempts(_cache.attempts(feed.name));
  if (attempts.count == 0) return true;
  const TimeInterval wait = std::min(kFirstWait * static_cast<TimeInterval>(1 << (attempts.count - 1)), kLongestWait);
  const TimeInterval since = -intervalFromNow(attempts.last);
  return since < 0 || since >= wait;
}

Outcome<LoadedStaticFeed> StaticFeedDownloads::load(const Feed& feed, const std::stop_token& stop) {
  if (!feed.staticFeed.isRemote()) return _store.load(feed, stop);
  if (auto held = _store.held(feed, stop)) {
    if (!held->isDue)
      dropFinished(feed);
    else if (mayAsk(feed))
      try {
        join(feed, true);
      } catch (const std::system_error& failure) {
        writeLog(kFeedLogFacility, LogLevel::error, "Cannot ask for a newer static feed of %{private}@: %{private}@",
                 {feed.name, failure.what()});
      }
    return std::move(held->loaded);
  }
  const auto download = join(feed, false);
  std::unique_lock guard(download->lock);
  download->changed.wait(guard, stop, [&] { return download->result.has_value(); });
  if (download->result) {
    auto result = *download->result;
    guard.unlock();
    dropFinished(feed);
    return result;
  }
  guard.unlock();
  ErrorRef error = firstUnderWay();
  return error ? error
               : transitLineServiceError(TransitLineServiceError::internal, "The program is ending.", feed.name);
}

std::vector<StaticFeedDownloads::Progress> StaticFeedDownloads::underWay() const {
  const std::lock_guard guard(_lock);
  std::vector<Progress> all;
  for (const auto& [name, download] : _downloads) {
    const std::lock_guard downloadGuard(download->lock);
    if (!download->result) all.push_back({name, download->received, download->length});
  }
  return all;
}

ErrorRef StaticFeedDownloads::firstUnderWay() const {
  const std::lock_guard guard(_lock);
  for (const auto& [name, download] : _downloads) {
    const std::lock_guard downloadGuard(download->lock);
    if (download->isHeld || download->result) continue;
    return downloading(name, download->received);
  }
  return nullptr;
}

}  // namespace nimbo
