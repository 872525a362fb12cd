#include "desktop/gtfs/feeds/FeedCache.h"

#include <fcntl.h>

#include <cstdio>
#include <system_error>
#include <vector>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/system/AtomicFile.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

std::filesystem::path FeedCache::file(std::string_view kind, std::string_view feed) const {
  // Names of feeds may hold any letters; those of files had better not.
  char name[40];
  std::snprintf(name, sizeof name, "%.*s-%016llx", static_cast<int>(kind.size()), kind.data(),
                static_cast<unsigned long long>(hashOfBytes(feed)));
  return _folder / name;
}

void FeedCache::remove(const Feed& feed) const {
  removeNamed(feed.name);
  removeNamed(feed.alerts.identity());  // those that it shared
}

void FeedCache::removeNamed(std::string_view feed) const {
  // Of whatever kind, and what killed processes left of them half written.
  const std::string mark = file("", feed).filename().native();
  std::error_code ignored;
  std::vector<std::filesystem::path> paths;
  for (const auto& entry : std::filesystem::directory_iterator(_folder, ignored))
    if (entry.path().filename().native().find(mark) != std::string::npos) paths.push_back(entry.path());
  for (const auto& path : paths) std::filesystem::remove(path, ignored);
}

void CacheUsers::join() {
  const std::lock_guard guard(_lock);
  if (_file || makeFolders(_folder)) return;
  _file = FileDescriptor(::open((_folder / "users").c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, 0600));
  struct flock mine {};
  mine.l_type = F_RDLCK;
  if (_file) ::fcntl(_file.get(), F_OFD_SETLK, &mine);
}

bool CacheUsers::hasOthers() {
  const std::lock_guard guard(_lock);
  struct flock others {};
  others.l_type = F_WRLCK;
  return _file && ::fcntl(_file.get(), F_OFD_GETLK, &others) == 0 && others.l_type != F_UNLCK;
}

void logCacheFailure(const std::string& reason) {
  writeLog(kFeedLogFacility, LogLevel::error, "Cannot keep a feed in the cache: %{private}@", {reason});
}

}  // namespace nimbo
