// The hand-off record of a line with ten incidents, beside protoc's generated code for the published schema.

#include <benchmark/benchmark.h>
#include <nimbo-activity.pb.h>

#include "handoff/NimboActivity.h"
#include "platform/wire/StoredTransitLineItem.h"
#include "support/MadeUpLines.h"

namespace nimbo {
namespace {

std::shared_ptr<NimboActivity> madeUpActivity() {
  const BenchPlatform platform;
  auto activity = std::make_shared<NimboActivity>();
  activity->setLineItem(StoredTransitLineItem::initWithLineItem(madeUpLines(1, 10, false).front()));
  const auto options = std::make_shared<MapDisplayOptions>();
  options->setMapType(1);
  activity->setDisplayOptions(options);
  return activity;
}

void decode(benchmark::State& state) {
  const Bytes bytes = madeUpActivity()->data();
  for (auto _ : state) {
    NimboActivity activity;
    ProtobufReader reader(bytes);
    if (!activity.readFrom(reader)) state.SkipWithError("the record is not read");
    benchmark::DoNotOptimize(activity);
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes.size()));
}
BENCHMARK(decode);

void decodePeer(benchmark::State& state) {
  const Bytes bytes = madeUpActivity()->data();
  for (auto _ : state) {
    proto::NimboActivity activity;
    if (!activity.ParseFromArray(bytes.data(), static_cast<int>(bytes.size())))
      state.SkipWithError("the record is not read");
    benchmark::DoNotOptimize(activity);
  }
}
BENCHMARK(decodePeer);

void encode(benchmark::State& state) {
  const auto activity = madeUpActivity();
  for (auto _ : state) {
    Bytes bytes = activity->data();
    benchmark::DoNotOptimize(bytes.data());
  }
}
BENCHMARK(encode);

void encodePeer(benchmark::State& state) {
  const Bytes bytes = madeUpActivity()->data();
  proto::NimboActivity activity;
  if (!activity.ParseFromArray(bytes.data(), static_cast<int>(bytes.size())))
    state.SkipWithError("the record is not read");
  for (auto _ : state) {
    std::string written = activity.SerializeAsString();
    benchmark::DoNotOptimize(written.data());
  }
}
BENCHMARK(encodePeer);

}  // namespace
}  // namespace nimbo
