#include "desktop/gtfs/feeds/FeedCatalog.h"

#include <algorithm>

#include "desktop/gtfs/feeds/FeedLookup.h"
#include "desktop/gtfs/static/LineItems.h"

namespace nimbo {

namespace {

/// A line that was found, in the feed of this place among those that were searched.
struct Hit {
  unsigned distance;
  std::size_t feed;
  std::size_t line;
};

FeedCatalog::Line lineOf(LineItems& items, const StaticFeed& feed, std::size_t index, std::uint64_t muid) {
  return {items.item(index, muid), std::string(feed.line(index).longName)};
}

}  // namespace

Outcome<FeedCatalog::Hits> FeedCatalog::find(const Query& query, const std::stop_token& stop,
                                             const Progress& progress) const {
  auto sources = _library.sources();
  if (!sources) return sources.error();
  if (query.feed) {
    const auto source = _library.sourceNamed(*query.feed);
    if (!source) return source.error();
    *sources = {*source};
  }
  const LineSearch search(query.text);
  Hits result;
  std::vector<std::pair<StaticFeed, LineItems>> feeds;
  std::vector<Hit> hits;
  for (std::size_t done = 0; done < sources->size() && !stop.stop_requested(); ++done) {
    const FeedSource& source = *(*sources)[done];
    if (progress) progress(source.name(), done, sources->size());
    const auto loaded = source.staticFeed(stop);
    if (!loaded) {
      result.errors.push_back(loaded.error()->ofFeed(source.name()));
      continue;
    }
    const StaticFeed& feed = loaded->feed;
    const auto index = indexOf(source.name(), feed);
    for (std::size_t line = 0; line < feed.lineCount(); ++line)
      if (const auto distance = index->distance(search, line)) hits.push_back({*distance, feeds.size(), line});
    feeds.emplace_back(feed, LineItems(source.name(), feed));
  }
  std::stable_sort(hits.begin(), hits.end(), [](const Hit& a, const Hit& b) { return a.distance < b.distance; });
  result.total = hits.size();
  for (std::size_t i = query.offset; i < hits.size() && result.lines.size() < query.limit; ++i) {
    auto& [feed, items] = feeds[hits[i].feed];
    result.lines.push_back(lineOf(items, feed, hits[i].line, feed.line(hits[i].line).muid));
  }
  return result;
}

std::shared_ptr<const LineIndex> FeedCatalog::indexOf(const std::string& name, const StaticFeed& feed) const {
  {
    const std::lock_guard guard(_lock);
    const auto kept = _indices.find(name);
    if (kept != _indices.end() && kept->second.checksum == feed.checksum()) return kept->second.index;
  }
  auto index = std::make_shared<const LineIndex>(feed, name);
  const std::lock_guard guard(_lock);
  _indices.insert_or_assign(name, KeptIndex{feed.checksum(), index});
  return index;
}

void FeedCatalog::forget() {
  const std::lock_guard guard(_lock);
  _indices.clear();
}

Outcome<FeedCatalog::Descriptions> FeedCatalog::describe(const std::vector<MapItemIdentifierRef>& identifiers,
                                                         const std::stop_token& stop, const Progress& progress) const {
  const auto sources = _library.sources();
  if (!sources) return sources.error();
  Descriptions result{std::vector<Description>(identifiers.size(), {std::nullopt, true}), {}};
  const auto fail = [&](const ErrorRef& error, const std::string& feed, const std::vector<std::size_t>& places) {
    result.errors.push_back(error->ofFeed(feed));
    for (const std::size_t place : places) result.lines[place].isGone = false;
  };
  std::vector<std::string> names;  // of the feeds that are asked for
  for (const FeedSourceRef& source : *sources) names.push_back(source->name());
  for (const MapItemIdentifierRef& identifier : identifiers)
    if (const auto& locator = identifier->locator();
        locator && std::find(names.begin(), names.end(), locator->feed) == names.end())
      names.push_back(locator->feed);
  for (std::size_t done = 0; done < names.size(); ++done) {
    std::vector<MapItemIdentifierRef> ofFeed;
    std::vector<std::size_t> places;
    for (std::size_t i = 0; i < identifiers.size(); ++i) {
      const auto& locator = identifiers[i]->locator();
      if (result.lines[i].line || (locator && locator->feed != names[done])) continue;
      ofFeed.push_back(identifiers[i]);
      places.push_back(i);
    }
    if (ofFeed.empty()) continue;
    if (progress) progress(names[done], done, names.size());
    const auto source = done < sources->size() ? (*sources)[done] : _library.sourceNamed(names[done]);
    const auto loaded = source ? (*source)->staticFeed(stop) : source.error();
    if (!loaded) {
      fail(loaded.error(), names[done], places);
      continue;
    }
    LineItems items(names[done], loaded->feed);
    const auto found = findLines(loaded->feed, names[done], ofFeed);
    for (std::size_t i = 0; i < found.size(); ++i)
      if (found[i]) result.lines[places[i]] = {lineOf(items, loaded->feed, found[i]->index, ofFeed[i]->muid()), false};
  }
  return result;
}

}  // namespace nimbo
