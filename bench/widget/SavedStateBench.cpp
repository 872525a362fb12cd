// What the widget saves when it goes and reads when it starts, beside nlohmann's CBOR of the same content.

#include <benchmark/benchmark.h>

#include <nlohmann/json.hpp>

#include "platform/Platform.h"
#include "platform/wire/StoredTransitLineItem.h"
#include "support/MadeUpLines.h"
#include "widget/NBTransitIncidentViewControllerState.h"

namespace nimbo {
namespace {

using nlohmann::json;

constexpr std::size_t kLines = 20, kIncidentsEach = 10;

/// Field by field, under the names of the schema.
json asJSON(const ObjectRef& object) {
  if (const auto dictionary = std::dynamic_pointer_cast<const BoxedDictionary>(object)) {
    json fields = json::object();
    for (const auto& [key, value] : dictionary->entries()) fields[key] = asJSON(value);
    return fields;
  }
  if (const auto array = std::dynamic_pointer_cast<const BoxedArray>(object)) {
    json elements = json::array();
    for (const ObjectRef& element : array->elements()) elements.push_back(asJSON(element));
    return elements;
  }
  if (const auto number = std::dynamic_pointer_cast<const BoxedNumber>(object))
    return std::visit([](auto value) { return json(value); }, number->value());
  if (const auto date = std::dynamic_pointer_cast<const BoxedDate>(object))
    return date->value().time_since_epoch().count();
  return descriptionOf(object);
}

void saveAndRestore(benchmark::State& state) {
  const BenchPlatform platform;
  const auto result = Result::resultWithValue(BoxedArray::of(madeUpLines(kLines, kIncidentsEach, true)));
  std::size_t size = 0;
  for (auto _ : state) {
    const auto saved = NBTransitIncidentViewControllerState::initWithLineItemsResult_expanded(result, true);
    const auto archived = Platform::current().archive().archivedDataWithRootObject(saved, true);
    const auto restored = NBTransitIncidentViewControllerState::unarchiveFromData_error(*archived, nullptr);
    if (!restored) state.SkipWithError("the state is not restored");
    size = archived->size();
  }
  state.counters["bytes"] = static_cast<double>(size);
}
BENCHMARK(saveAndRestore)->Unit(benchmark::kMicrosecond);

void saveAndRestorePeer(benchmark::State& state) {
  const BenchPlatform platform;
  json content = {{"expanded", true}, {"lineItems", json::array()}};
  for (const TransitLineItemRef& line : madeUpLines(kLines, kIncidentsEach, true))
    content["lineItems"].push_back(asJSON(StoredTransitLineItem::initWithLineItem(line)->dictionaryRepresentation()));
  std::size_t size = 0;
  for (auto _ : state) {
    const std::vector<std::uint8_t> bytes = json::to_cbor(content);
    const json restored = json::from_cbor(bytes);
    if (restored.size() != content.size()) state.SkipWithError("the content is not restored");
    size = bytes.size();
  }
  state.counters["bytes"] = static_cast<double>(size);
}
BENCHMARK(saveAndRestorePeer)->Unit(benchmark::kMicrosecond);

}  // namespace
}  // namespace nimbo
