#include "desktop/gtfs/feeds/FeedCache.h"

#include <cstdio>
#include <system_error>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

std::filesystem::path FeedCache::file(std::string_view kind, std::string_view feed) const {
  // Names of feeds may hold any letters; those of files had better not.
  char name[40];
  std::snprintf(name, sizeof name, "%.*s-%016llx", static_cast<int>(kind.size()), kind.data(),
                static_cast<unsigned long long>(hashOfBytes(feed)));
  return _folder / name;
}

void FeedCache::remove(std::string_view feed) const {
  std::error_code ignored;
  for (const auto& path : {staticFeed(feed), trips(feed), alerts(feed)}) std::filesystem::remove(path, ignored);
}

void logCacheFailure(const std::string& reason) {
  writeLog(kFeedLogFacility, LogLevel::error, "Cannot keep a feed in the cache: %{private}@", {reason});
}

}  // namespace nimbo
