#include "desktop/archive/HandoffDecoder.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "desktop/archive/ArchiveFormat.h"
#include "desktop/archive/Bzip2.h"
#include "desktop/archive/CBORKeyedArchive.h"
#include "handoff/NBUserActivityData.h"
#include "handoff/NimboActivity.h"
#include "platform/wire/StoredTransitIncident.h"
#include "widget/NBTransitIncidentViewControllerState.h"

namespace nimbo {

namespace {

using nlohmann::json;

constexpr std::size_t kMaximumRecordSize = std::size_t{16} << 20;

std::string hexadecimal(const Bytes& bytes) {
  std::string text;
  text.reserve(2 * bytes.size());
  for (const std::uint8_t byte : bytes) {
    char digits[3];
    std::snprintf(digits, sizeof digits, "%02x", static_cast<unsigned>(byte));
    text += digits;
  }
  return text;
}

json jsonOf(const ObjectRef& object);

json jsonOfEntries(const BoxedDictionary& dictionary) {
  json map = json::object();
  for (const auto& [key, value] : dictionary.entries()) map.emplace(key, jsonOf(value));
  return map;
}

json jsonOfState(const NBTransitIncidentViewControllerState& state) {
  json map{{"expanded", state.expanded()}};
  state.lineItemsResult()->withValue_orError(
      [&](const ObjectRef& lineItems) { map["lineItemResultSuccess"] = jsonOf(lineItems); },
      [&](const ErrorRef& error) { map["lineItemResultError"] = jsonOf(error); });
  return map;
}

json jsonOf(const ObjectRef& object) {
  const Object* value = object.get();
  if (const auto* number = dynamic_cast<const BoxedNumber*>(value))
    return std::visit([](auto plain) { return json(plain); }, number->value());
  if (const auto* data = dynamic_cast<const BoxedData*>(value)) return hexadecimal(data->value());
  if (const auto* dictionary = dynamic_cast<const BoxedDictionary*>(value)) return jsonOfEntries(*dictionary);
  if (const auto* record = dynamic_cast<const CodableRecord*>(value))
    return jsonOfEntries(*record->dictionaryRepresentation());
  if (const auto* state = dynamic_cast<const NBTransitIncidentViewControllerState*>(value)) return jsonOfState(*state);
  if (const auto* error = dynamic_cast<const Error*>(value))
    return {{"domain", error->domain()}, {"code", error->code()}, {"userInfo", jsonOfEntries(*error->userInfo())}};
  if (const auto* array = dynamic_cast<const BoxedArray*>(value)) {
    json elements = json::array();
    for (const ObjectRef& element : array->elements()) elements.push_back(jsonOf(element));
    return elements;
  }
  return descriptionOf(object);
}

HandoffContent failure(std::string reason) {
  return {nullptr, Error::errorWithDomain_code_reason(std::string(kHandoffErrorDomain), 0, std::move(reason))};
}

HandoffContent readRecord(std::span<const std::uint8_t> bytes) {
  if (bytes.size() > kMaximumRecordSize)
    return failure("the activity record has more than " + std::to_string(kMaximumRecordSize) + " bytes");
  ProtobufReader reader(bytes);
  const auto activity = std::make_shared<NimboActivity>();
  if (!activity->readFrom(reader)) return failure("the activity record is broken: " + reader.failureText());
  if (reader.position() < reader.length())
    return failure("the activity record is broken: it ends with the end of a group that is not open, before byte " +
                   std::to_string(reader.position()) + " of " + std::to_string(reader.length()));
  if (activity->dictionaryRepresentation()->entries().empty())
    return failure(
        "the bytes hold no field of an activity record, and are neither a bzip2 stream nor an archive; "
        "pass the value under \"bs\" or \"incidentListKey\" of a hand-off, or a saved state");
  return {activity, nullptr};
}

HandoffContent readArchive(std::span<const std::uint8_t> bytes) {
  const CBORKeyedArchive::Opened opened = CBORKeyedArchive::openData(bytes);
  if (!opened.unarchiver) return {nullptr, opened.error};
  const ArchivableClass& stateClass = NBTransitIncidentViewControllerState::archivedClass();
  opened.unarchiver->setClass_forClassName(stateClass, kEarlierStateClassName);
  opened.unarchiver->setDecodingFailurePolicy(DecodingFailurePolicy::setErrorAndReturn);
  const auto [root, error] = opened.unarchiver->decodeTopLevelObjectOfClasses_forKey(
      {&kArrayClass, &StoredTransitIncident::archivedClass(), &stateClass}, kKeyedArchiveRootObjectKey);
  if (error) return {nullptr, error};
  if (!root) return failure("the archive's root holds neither a list of incidents nor a state with a result");
  return {root, nullptr};
}

bool isBzip2Stream(std::span<const std::uint8_t> bytes) {
  return bytes.size() >= 4 && bytes[0] == 'B' && bytes[1] == 'Z' && bytes[2] == 'h' && bytes[3] >= '1' &&
         bytes[3] <= '9';
}

/// Whether the bytes begin as a CBOR map does. No record begins so: its first field would have a number above 19.
bool isMap(std::span<const std::uint8_t> bytes) {
  constexpr unsigned kMajorTypeMap = 5;
  return bytes.front() >> 5 == kMajorTypeMap;
}

}  // namespace

HandoffContent readHandoff(std::span<const std::uint8_t> bytes) {
  if (bytes.empty()) return failure("there are no bytes");
  if (isMap(bytes)) return readArchive(bytes);
  if (!isBzip2Stream(bytes)) return readRecord(bytes);
  const Bzip2Decompressed record = bzip2DecompressedData(bytes, kMaximumRecordSize);
  return record.bytes ? readRecord(*record.bytes) : HandoffContent{nullptr, record.error};
}

DecodedHandoff decodeHandoff(std::span<const std::uint8_t> bytes) {
  const auto [content, error] = readHandoff(bytes);
  if (error) return {std::nullopt, error};
  const bool isList = dynamic_cast<const BoxedArray*>(content.get()) != nullptr;
  const std::string name(isList ? kNimboTransitWidgetIncidentSummaryActivityUserInfoKey : content->className());
  const json named{{name, jsonOf(content)}};
  // Records keep texts as they were sent: what is not UTF-8 is shown as U+FFFD.
  return {named.dump(2, ' ', false, json::error_handler_t::replace), nullptr};
}

}  // namespace nimbo
