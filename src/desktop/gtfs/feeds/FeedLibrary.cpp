#include "desktop/gtfs/feeds/FeedLibrary.h"

#include <map>

#include "desktop/gtfs/feeds/FeedSource.h"
#include "desktop/gtfs/feeds/SampleCity.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "platform/SystemServices.h"

namespace nimbo {

FeedSourceRef FeedLibrary::sampleCity() const {
  const std::lock_guard guard(_lock);
  if (!_sampleCity) _sampleCity = std::make_shared<const SampleCity>(currentDate());
  return _sampleCity;
}

Outcome<std::vector<FeedSourceRef>> FeedLibrary::sources() const {
  const auto feeds = _configuration.feeds();
  if (!feeds) return feeds.error();
  std::vector<FeedSourceRef> sources;
  std::map<std::string, std::shared_ptr<SharedAlerts>> alerts;
  for (const Feed& feed : *feeds) {
    auto& shared = alerts[feed.nameOfAlerts()];
    if (!shared) shared = std::make_shared<SharedAlerts>();
    sources.push_back(std::make_shared<const ConfiguredFeedSource>(feed, _cache, _users, _downloads, shared));
  }
  if (sources.empty()) sources.push_back(sampleCity());
  return sources;
}

Outcome<FeedSourceRef> FeedLibrary::sourceNamed(std::string_view name) const {
  const auto all = sources();
  if (!all) return all.error();
  std::string names;
  for (const FeedSourceRef& source : *all) {
    if (source->name() == name) return source;
    names += " " + source->name();
  }
  return transitLineServiceError(TransitLineServiceError::unknownFeed,
                                 "No feed named \"" + std::string(name) +
                                     "\" is set up. Set it up again, or take its lines out of the favorites. Feeds "
                                     "there are:" +
                                     names + ".",
                                 std::string(name));
}

}  // namespace nimbo
