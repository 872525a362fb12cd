// Feeds of 5000 routes and 5000 alerts: beside libprotobuf's lightest code, which only parses, and libcsv, which only
// splits fields.

#include <benchmark/benchmark.h>
#include <csv.h>
#include <gtfs-realtime.pb.h>
#include <time.h>

#include <chrono>
#include <fstream>
#include <sstream>

#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/feeds/FeedMuid.h"
#include "desktop/gtfs/static/StaticFeedStore.h"
#include "support/MadeUpFeed.h"
#include "support/MadeUpLines.h"

namespace nimbo {
namespace {

constexpr std::size_t kFavorites = 20;

std::uint64_t secondsNow() {
  const auto now = std::chrono::system_clock::now().time_since_epoch();
  return static_cast<std::uint64_t>(std::chrono::duration_cast<std::chrono::seconds>(now).count());
}

/// What this process has had of a processor: what others take on a shared machine does not count.
double processorSeconds() {
  timespec time{};
  clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
  return static_cast<double>(time.tv_sec) + 1e-9 * static_cast<double>(time.tv_nsec);
}

/// The made-up feed in a folder.
class FeedFolder {
 public:
  explicit FeedFolder(const BenchPlatform& platform) : _folder(platform.folder() / "feed") {
    std::filesystem::create_directories(_folder);
    std::ofstream(_folder / "routes.txt") << madeUpRoutes();
    std::ofstream(_folder / "agency.txt") << madeUpAgencies();
  }
  std::filesystem::path routes() const { return _folder / "routes.txt"; }
  Feed feed() const {
    return {
        .name = "metro", .staticFeed = *FeedAddress::parse(_folder.native()), .alerts = *FeedAddress::parse("/none")};
  }

 private:
  std::filesystem::path _folder;
};

void staticFeedFromCache(benchmark::State& state) {
  const BenchPlatform platform;
  const FeedFolder folder(platform);
  const StaticFeedStore store(FeedCache(platform.folder() / "cache"));
  const Feed feed = folder.feed();
  if (const auto first = store.load(feed, {}); !first) return state.SkipWithError(first.error()->reason().c_str());
  for (auto _ : state) {
    const auto loaded = store.load(feed, {});
    if (loaded->feed.lineCount() != kMadeUpRoutes) state.SkipWithError("the static feed is not whole");
  }
}
BENCHMARK(staticFeedFromCache)->Unit(benchmark::kMicrosecond);

void staticFeedFromCachePeer(benchmark::State& state) {
  const BenchPlatform platform;
  const FeedFolder folder(platform);
  for (auto _ : state) {
    std::ifstream file(folder.routes(), std::ios::binary);
    std::ostringstream text;
    text << file.rdbuf();
    const std::string bytes = std::move(text).str();
    csv_parser parser;
    csv_init(&parser, 0);
    std::size_t fields = 0;
    const auto onField = [](void*, std::size_t, void* count) { ++*static_cast<std::size_t*>(count); };
    csv_parse(&parser, bytes.data(), bytes.size(), onField, nullptr, &fields);
    csv_fini(&parser, onField, nullptr, &fields);
    csv_free(&parser);
    if (fields != 7 * (kMadeUpRoutes + 1)) state.SkipWithError("routes.txt is not whole");
  }
}
BENCHMARK(staticFeedFromCachePeer)->Unit(benchmark::kMicrosecond);

void alerts(benchmark::State& state) {
  const BenchPlatform platform;
  const FeedFolder folder(platform);
  const auto loaded = StaticFeedStore(FeedCache(platform.folder() / "cache")).load(folder.feed(), {});
  IncidentQuery query;
  query.feed = "metro";
  query.language = {"en", "en"};
  query.now = currentDate();
  query.trips = loaded->trips;
  for (std::uint32_t i = 0; i < kFavorites; ++i)
    query.lines.push_back({i * 200, lineMuid("metro", "R" + std::to_string(i * 200))});
  const std::string bytes = madeUpAlerts(secondsNow());
  state.counters["bytes"] = static_cast<double>(bytes.size());
  for (auto _ : state) {
    std::string fetched = bytes;  // a fetch brings bytes of its own
    const double begin = processorSeconds();
    {
      const auto feed = AlertsFeed::read(std::move(fetched), "bench");
      const IncidentReading reading = readIncidents(*feed, loaded->feed, query);
      if (reading.verdicts.front().incidents().empty()) state.SkipWithError("there are no incidents");
    }
    state.SetIterationTime(processorSeconds() - begin);
  }
}
BENCHMARK(alerts)->UseManualTime()->Unit(benchmark::kMillisecond);

void alertsPeer(benchmark::State& state) {
  const std::string bytes = madeUpAlerts(secondsNow());
  for (auto _ : state) {
    transit_realtime::FeedMessage feed;
    if (!feed.ParseFromString(bytes)) state.SkipWithError("the feed is not read");
    benchmark::DoNotOptimize(feed);
  }
}
BENCHMARK(alertsPeer)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace nimbo
