#include "desktop/gtfs/static/StaticFeedStore.h"

#include <fcntl.h>

#include <algorithm>
#include <cstdlib>

#include "desktop/gtfs/feeds/OtherContent.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/FeedsPart.h"
#include "desktop/gtfs/net/FileReading.h"
#include "desktop/gtfs/static/StaticFeedFiles.h"
#include "desktop/raii/FileDescriptor.h"
#include "desktop/system/AtomicFile.h"
#include "platform/SystemServices.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

constexpr std::uint64_t kLargestCacheFile = 256 << 20;
constexpr std::uint64_t kLargestDownload = 512 << 20;
constexpr std::chrono::seconds kDownloadTimeLimit{600};
constexpr TimeInterval kRemoteCheckInterval = 86400;

/// What a local source is now; empty when there is none.
std::string localFingerprint(const std::filesystem::path& path) {
  std::error_code ignored;
  if (!std::filesystem::is_directory(path, ignored)) {
    const std::string state = fileFingerprint(path);
    return state.empty() ? state : path.native() + "\n" + state;
  }
  std::string fingerprint = path.native();
  for (const char* name : {"agency.txt", "routes.txt", "feed_info.txt", "trips.txt"})
    fingerprint += "\n" + fileFingerprint(path / name);
  return fingerprint;
}

// A remote source's fingerprint is its address and what the server says of its state.
std::string remoteFingerprint(const FeedAddress& address, const HTTPValidators& validators) {
  return address.identity() + "\n" + validators.etag + "\n" + validators.lastModified;
}

std::optional<HTTPValidators> validatorsIn(std::string_view fingerprint, const FeedAddress& address) {
  const std::string begin = address.identity() + "\n";
  const std::size_t end = fingerprint.find('\n', begin.size());
  if (!fingerprint.starts_with(begin) || end == std::string_view::npos) return std::nullopt;
  return HTTPValidators{std::string(fingerprint.substr(begin.size(), end - begin.size())),
                        std::string(fingerprint.substr(end + 1))};
}

Outcome<std::unique_ptr<StaticFeedFiles>> openLocal(const std::filesystem::path& path) {
  std::error_code ignored;
  if (std::filesystem::is_directory(path, ignored))
    return std::unique_ptr<StaticFeedFiles>(std::make_unique<FolderFeedFiles>(path));
  const auto unreadable = [&](const std::string& why) {
    return transitLineServiceError(
        TransitLineServiceError::unreadableFile,
        "Cannot read the static feed " + path.native() + ": " + why + ". Check the path, or set the feed up anew.",
        path.native());
  };
  FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
  if (!file) return unreadable(std::generic_category().message(errno));
  if (!std::filesystem::is_regular_file(path, ignored)) return unreadable("it is neither a file nor a folder");
  char beginning[kTellingBytes];
  const ssize_t count = ::pread(file.get(), beginning, sizeof beginning, 0);
  if (ErrorRef error =
          otherThanStatic({beginning, static_cast<std::size_t>(std::max<ssize_t>(count, 0))}, path.native()))
    return error;
  return openZippedFeed(file, path.native());
}

/// A file without a name in the folder: it goes when it is closed, whatever happens.
FileDescriptor temporaryFile(const std::filesystem::path& folder) {
  if (FileDescriptor unnamed{::open(folder.c_str(), O_TMPFILE | O_RDWR | O_CLOEXEC, 0600)}) return unnamed;
  // Not every file system has files without a name.
  std::string name = (folder / "download.XXXXXX").native();
  FileDescriptor file(::mkostemp(name.data(), O_CLOEXEC));
  if (file) ::unlink(name.c_str());
  return file;
}

bool writeAll(const FileDescriptor& file, std::string_view bytes) {
  while (!bytes.empty()) {
    const ssize_t count = ::write(file.get(), bytes.data(), bytes.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) return false;
    bytes.remove_prefix(static_cast<std::size_t>(count));
  }
  return true;
}

ErrorRef noTrips(const Feed& feed, const std::string& why) {
  const std::string place = feed.staticFeed.publicText();
  return transitLineServiceError(
      TransitLineServiceError::tripsMissing,
      "An alert names a trip alone, and the trips of the static feed " + place + " cannot be had: " + why + ".", place);
}

Outcome<TripRoutes> wholeTrips(const Feed& feed, TripRoutes trips) {
  if (trips.isWhole()) return trips;
  return noTrips(feed, "its trips.txt is missing or damaged. Ask the publisher for a whole feed");
}

bool isDue(const StaticFeed& cached) {
  const TimeInterval age = -intervalFromNow(cached.checkedAt());
  return age < 0 || age >= kRemoteCheckInterval;
}

std::uint64_t tripsKey(const StaticFeed& feed) { return hashOfBytes(feed.fingerprint()); }

void keep(const std::filesystem::path& path, std::string_view bytes) {
  if (const ErrorRef error = writeFileAtomically(path, bytes)) logCacheFailure(error->reason());
}

}  // namespace

std::optional<StaticFeed> StaticFeedStore::readCache(const Feed& feed) const {
  auto bytes = readOwnFile(_cache.staticFeed(feed.name), kLargestCacheFile);
  return bytes ? StaticFeed::fromBytes(std::move(*bytes)) : std::nullopt;
}

SelectorMatcher::TripLookup StaticFeedStore::lookupIn(const Feed& feed, const TripRoutes& trips) {
  return [routes = wholeTrips(feed, trips)](std::string_view tripID) -> Outcome<std::optional<std::uint32_t>> {
    if (!routes) return routes.error();
    return routes->lineOfTrip(tripID);
  };
}

LoadedStaticFeed StaticFeedStore::withTrips(const Feed& feed, StaticFeed staticFeed, std::optional<TripRoutes> trips,
                                            const std::stop_token& stop) const {
  const auto held = std::make_shared<std::optional<Outcome<TripRoutes>>>();
  if (trips) *held = wholeTrips(feed, std::move(*trips));
  const auto lookup = [store = *this, feed, staticFeed, stop,
                       held](std::string_view tripID) -> Outcome<std::optional<std::uint32_t>> {
    if (!*held) *held = store.readTrips(feed, staticFeed, stop);
    if (!**held) return (*held)->error();
    return (**held)->lineOfTrip(tripID);
  };
  return {std::move(staticFeed), lookup};
}

Outcome<TripRoutes> StaticFeedStore::readTrips(const Feed& feed, const StaticFeed& staticFeed,
                                               const std::stop_token& stop) const {
  if (const auto bytes = readOwnFile(_cache.trips(feed.name), kLargestCacheFile))
    if (auto kept = TripRoutes::fromBytes(*bytes, tripsKey(staticFeed), staticFeed.lineCount()))
      return wholeTrips(feed, std::move(*kept));
  auto fresh = readAnew(feed, stop);
  if (!fresh) return fresh.error();
  if (fresh->feed.fingerprint() != staticFeed.fingerprint())
    return noTrips(feed, "it has changed while it was read. Try again");
  return wholeTrips(feed, std::move(fresh->trips));
}

Outcome<FreshStaticFeed> StaticFeedStore::parse(StaticFeedFiles& files, const Feed& feed,
                                                const std::string& fingerprint) const {
  auto parsed = readStaticFeed(files, feed.name);
  if (!parsed) return parsed.error();
  FreshStaticFeed fresh{parsed->feed.finish(fingerprint, currentDate()), std::move(parsed->trips),
                        std::move(parsed->skipped)};
  // The trips first: the static feed is what says that both are there.
  keep(_cache.trips(feed.name), fresh.trips.bytes(tripsKey(fresh.feed)));
  keep(_cache.staticFeed(feed.name), fresh.feed.bytes());
  return fresh;
}

Outcome<std::optional<FreshStaticFeed>> StaticFeedStore::fetch(const Feed& feed, const HTTPValidators& validators,
                                                               const std::stop_token& stop,
                                                               const Progress& progress) const {
  auto fetched = fetchFrom(feed, feed.staticFeed, validators, stop, progress);
  if (fetched || !feed.staticMirror || stop.stop_requested()) return fetched;
  auto copy = fetchFrom(feed, *feed.staticMirror, {}, stop, progress);
  if (!copy) return fetched;
  writeLog(kFeedLogFacility, LogLevel::info, "The copy of the static feed of %{private}@ stands in: %{private}@",
           {feed.name, fetched.error()->reason()});
  return copy;
}

Outcome<std::optional<FreshStaticFeed>> StaticFeedStore::fetchFrom(const Feed& feed, const FeedAddress& address,
                                                                   const HTTPValidators& validators,
                                                                   const std::stop_token& stop,
                                                                   const Progress& progress) const {
  if (ErrorRef error = makeFolders(_cache.folder())) return error;
  const FileDescriptor file = temporaryFile(_cache.folder());
  if (!file) return fileError("write in", _cache.folder(), errno);
  std::string beginning;
  std::uint64_t received = 0;
  std::optional<std::uint64_t> length;
  const HTTPRequest request{address,          validators,
                            kLargestDownload, kDownloadTimeLimit,
                            nullptr,          [&length](std::uint64_t bytes) { length = bytes; }};
  const auto answer = HTTPFetcher::fetch(request, stop, [&](std::string_view piece) {
    received += piece.size();
    if (progress) progress(received, length);
    if (beginning.size() < kTellingBytes) beginning += piece.substr(0, kTellingBytes);
    return writeAll(file, piece);
  });
  if (!answer) return answer.error();
  if (answer->isUnchanged) return std::optional<FreshStaticFeed>();
  if (ErrorRef error = otherThanStatic(beginning, address.publicText())) return error;
  auto files = openZippedFeed(file, address.publicText());
  if (!files) return files.error();
  // What a copy's server says of its state tells nothing of the source's.
  const bool isSource = address == feed.staticFeed;
  auto fresh =
      parse(**files, feed, remoteFingerprint(feed.staticFeed, isSource ? answer->validators : HTTPValidators()));
  if (!fresh) return fresh.error();
  return std::optional(std::move(*fresh));
}

Outcome<FreshStaticFeed> StaticFeedStore::readAnew(const Feed& feed, const std::stop_token& stop,
                                                   const Progress& progress) const {
  if (feed.staticFeed.isRemote()) {
    auto fetched = fetch(feed, {}, stop, progress);
    if (!fetched) return fetched.error();
    return std::move(**fetched);  // without validators nothing is unchanged
  }
  // What the source is, before it is read: a change meanwhile is found the next time.
  const std::string fingerprint = localFingerprint(feed.staticFeed.path());
  auto files = openLocal(feed.staticFeed.path());
  if (!files) return files.error();
  return parse(**files, feed, fingerprint);
}

Outcome<LoadedStaticFeed> StaticFeedStore::loadRemote(const Feed& feed, const std::optional<StaticFeed>& cached,
                                                      const std::stop_token& stop, const Progress& progress) const {
  const auto validators = cached ? validatorsIn(cached->fingerprint(), feed.staticFeed) : std::nullopt;
  const bool isHeld = validators.has_value();
  if (isHeld && !isDue(*cached)) return withTrips(feed, *cached, std::nullopt, stop);
  auto fetched = fetch(feed, validators.value_or(HTTPValidators()), stop, progress);
  if (fetched && *fetched) return withTrips(feed, (*fetched)->feed, std::move((*fetched)->trips), stop);
  if (!fetched) {
    if (!isHeld) return fetched.error();
    writeLog(kFeedLogFacility, LogLevel::error, "Keeping the older static feed of %{private}@: %{private}@",
             {feed.name, fetched.error()->reason()});
    return withTrips(feed, *cached, std::nullopt, stop);
  }
  StaticFeed checked = cached->checkedAgainAt(currentDate());
  keep(_cache.staticFeed(feed.name), checked.bytes());
  return withTrips(feed, std::move(checked), std::nullopt, stop);
}

std::optional<StaticFeedStore::Held> StaticFeedStore::held(const Feed& feed, const std::stop_token& stop) const {
  const auto cached = readCache(feed);
  if (!cached || !validatorsIn(cached->fingerprint(), feed.staticFeed)) return std::nullopt;
  return Held{withTrips(feed, *cached, std::nullopt, stop), isDue(*cached)};
}

Outcome<LoadedStaticFeed> StaticFeedStore::load(const Feed& feed, const std::stop_token& stop,
                                                const Progress& progress) const {
  const auto cached = readCache(feed);
  if (feed.staticFeed.isRemote()) return loadRemote(feed, cached, stop, progress);
  const std::string fingerprint = localFingerprint(feed.staticFeed.path());
  if (cached && !fingerprint.empty() && cached->fingerprint() == fingerprint)
    return withTrips(feed, *cached, std::nullopt, stop);
  auto fresh = readAnew(feed, stop);
  if (!fresh) return fresh.error();
  return withTrips(feed, fresh->feed, std::move(fresh->trips), stop);
}

}  // namespace nimbo
