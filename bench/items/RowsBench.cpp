#include <benchmark/benchmark.h>

#include "items/NBTransitIncidentsDataSourceBuilder.h"
#include "support/MadeUpLines.h"
#include "ui/ArtworkCache+Nimbo.h"

namespace nimbo {
namespace {

NBTransitListItemRef build(const TransitLineItems& lines) {
  return NBTransitIncidentsDataSourceBuilder::initWithLineItems_maxNumberOfItems_artworkCache_analytics(
             lines, 0, memoryConstrainedImageViewCache(), nullptr)
      ->listItem();
}

/// All rows made anew from lines that are held, as when an incident starts or ends.
void rebuild(benchmark::State& state, bool shared) {
  const BenchPlatform platform;
  const auto lines =
      madeUpLines(static_cast<std::size_t>(state.range(0)), static_cast<std::size_t>(state.range(1)), shared);
  NBTransitListItemRef item = build(lines);
  for (auto _ : state) item = build(lines);
  state.counters["rows"] = static_cast<double>(item->expandedItemsOrEmpty().size());
}
BENCHMARK_CAPTURE(rebuild, shared, true)
    ->Args({20, 10})
    ->Args({50, 20})
    ->Args({500, 20})
    ->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(rebuild, alone, false)->Args({50, 20})->Args({500, 20})->Unit(benchmark::kMillisecond);

/// The rows of two fetches that brought the same.
void equality(benchmark::State& state) {
  const BenchPlatform platform;
  const auto count = static_cast<std::size_t>(state.range(0));
  const auto a = build(madeUpLines(count, 1, false)), b = build(madeUpLines(count, 1, false));
  for (auto _ : state) {
    bool equal = a->isEqual(b.get());
    benchmark::DoNotOptimize(equal);
    if (!equal) state.SkipWithError("the list items differ");
  }
}
BENCHMARK(equality)->Arg(20)->Arg(100)->Unit(benchmark::kMicrosecond);

}  // namespace
}  // namespace nimbo
