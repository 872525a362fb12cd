#include "process/SourceWatch.h"

#include <sys/inotify.h>
#include <sys/stat.h>

#include <array>
#include <utility>

#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/store/RefreshSetting.h"

namespace nimbo {

namespace {

constexpr std::uint32_t kSourceEvents = IN_CLOSE_WRITE | IN_CREATE | IN_DELETE | IN_MOVED_FROM | IN_MOVED_TO |
                                        IN_DELETE_SELF | IN_MOVE_SELF | IN_ONLYDIR | IN_MASK_ADD;

/// Whether somebody begins a file, whose end is told of too.
bool isBegun(const inotify_event& event, const std::filesystem::path& path) {
  struct stat status {};
  return (event.mask & IN_CREATE) && ::lstat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode) &&
         status.st_nlink == 1;
}

}  // namespace

SourceWatch::SourceWatch(GLibRunLoop& runLoop, const Paths& paths, const FavoritesEditor& favorites,
                         std::shared_ptr<SharedSettingsStore> settings, std::function<void()> changed)
    : _runLoop(runLoop),
      _paths(paths),
      _favorites(favorites),
      _settings(std::move(settings)),
      _changed(std::move(changed)) {
  watch();
  _stateMark = stateMark();
}

SourceWatch::~SourceWatch() {
  if (_settling) _settling->invalidate();
}

std::string SourceWatch::stateMark() const {
  return std::to_string(_favorites.mark()) + " " + std::to_string(refreshSecondsOf(*_settings));
}

void SourceWatch::watch() {
  _source.reset();
  _places.clear();
  _events = FileDescriptor(::inotify_init1(IN_NONBLOCK | IN_CLOEXEC));
  if (!_events) return;
  for (const char* name : {"state.sqlite", "state.sqlite-wal"}) watchFile(_paths.state / name, true);
  for (const char* name : {"feeds.json", "keys.json"}) watchFile(_paths.config / name);
  if (const auto feeds = FeedConfiguration(_paths.config).feeds())
    for (const Feed& feed : *feeds)
      for (const FeedAddress* address : {&feed.staticFeed, &feed.alerts}) {
        if (address->isRemote()) continue;
        watchFile(address->path());
        watchPlace({address->path(), {}});
      }
  _source = _runLoop.watchReadable(_events.get(), [this] { readEvents(); });
}

void SourceWatch::watchFile(const std::filesystem::path& path, bool isState) {
  std::error_code error;
  std::filesystem::path there = path;
  while (there.has_relative_path() && !std::filesystem::is_directory(there.parent_path(), error))
    there = there.parent_path();
  watchPlace({there.parent_path(), there.filename(), isState});
  const auto real = std::filesystem::canonical(path, error);
  if (!error && real != path) watchPlace({real.parent_path(), real.filename(), isState});
}

void SourceWatch::watchPlace(Place place) {
  // The log of the database stays open while it is written.
  const int number = ::inotify_add_watch(_events.get(), place.folder.c_str(),
                                         place.isState ? kSourceEvents | IN_MODIFY : kSourceEvents);
  if (number >= 0) _places.emplace(number, std::move(place));
}

void SourceWatch::readEvents() {
  alignas(inotify_event) std::array<char, 16 * 1024> bytes;
  bool isOfInterest = false;
  for (ssize_t count; (count = ::read(_events.get(), bytes.data(), bytes.size())) > 0;) {
    for (const char* next = bytes.data(); next < bytes.data() + count;) {
      const auto& event = *reinterpret_cast<const inotify_event*>(next);
      next += sizeof event + event.len;
      const std::string name = event.len > 0 ? event.name : "";
      const auto [begin, end] = _places.equal_range(event.wd);
      // Of a folder itself, or of too many to be told: anything may have changed.
      if (name.empty() && (event.mask & (IN_DELETE_SELF | IN_MOVE_SELF | IN_Q_OVERFLOW)))
        isOfInterest = _hasChanged = true;
      for (auto place = begin; place != end; ++place) {
        const bool isMeant = !name.empty() && (place->second.name.empty() || place->second.name == name);
        if (!isMeant || (!place->second.isState && (event.mask & IN_MODIFY)) ||
            isBegun(event, place->second.folder / name))
          continue;
        isOfInterest = true;
        if (!place->second.isState) _hasChanged = true;
      }
    }
  }
  if (!isOfInterest || _settling) return;
  // One that repeats does not wait for a clock that was set back.
  _settling = _runLoop.scheduleTimer(kSettling, true, [this](Timer& timer) {
    timer.invalidate();
    _settling = nullptr;
    settle();
  });
}

void SourceWatch::settle() {
  const bool isAnotherState = stateMark() != _stateMark;
  if (!std::exchange(_hasChanged, false) && !isAnotherState) return;
  // What changed while nothing was watched is told of by this, too.
  watch();
  _stateMark = stateMark();
  _changed();
}

}  // namespace nimbo
