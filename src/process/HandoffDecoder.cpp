#include "process/HandoffDecoder.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "desktop/archive/ArchiveFormat.h"
#include "desktop/archive/Bzip2.h"
#include "desktop/archive/CBORKeyedArchive.h"
#include "desktop/gtfs/text/Utf8.h"
#include "handoff/NBUserActivityData.h"
#include "handoff/NimboActivity.h"
#include "platform/wire/StoredTransitIncident.h"
#include "platform/wire/StoredTransitLineItem.h"
#include "process/Snapshot.h"
#include "widget/NBTransitIncidentViewControllerState.h"

namespace nimbo {

namespace {

using nlohmann::json;

// As feeds are bounded, so that a page shows no more of one than of the other.
constexpr std::size_t kMaximumHandoffSize = std::size_t{1} << 20;
constexpr std::size_t kMostIncidents = 5000;
constexpr std::size_t kLongestTitle = 500, kLongestText = 10'000;  // characters

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

std::optional<protocol::Shield> shieldOf(const TransitArtworkRef& artwork) {
  return artwork ? std::optional(shieldOf(*artwork)) : std::nullopt;
}

std::optional<std::string> within(const std::optional<std::string>& text, std::size_t limit) {
  return text ? std::optional<std::string>(firstCharacters(*text, limit)) : std::nullopt;
}

/// A date that can be written; a payload may hold any.
std::optional<Date> writableDate(std::optional<Date> date) {
  return date && dateFromISOText(isoTextOfDate(*date)) ? date : std::nullopt;
}

protocol::Incident incidentOf(const TransitIncident& incident) {
  protocol::Incident result{.muid = incident.muid(),
                            .title = within(incident.title(), kLongestTitle),
                            .summary = within(incident.summary(), kLongestText),
                            .fullDescription = within(incident.fullDescription(), kLongestText),
                            .startDate = writableDate(incident.startDate()),
                            .endDate = writableDate(incident.endDate()),
                            .lastUpdated = writableDate(incident.lastUpdated()),
                            .isBlocking = incident.isBlockingIncident(),
                            .linkURL = incident.linkURL()};
  for (const auto& entity : incident.affectedEntities()) result.affectedLines.push_back(entity->muid());
  return result;
}

protocol::Line lineOf(const TransitLineItem& line) {
  protocol::Line result{.muid = line.muid(),
                        .name = within(line.name(), kLongestTitle),
                        .artwork = shieldOf(line.artwork()),
                        .alternateArtwork = shieldOf(line.alternateArtwork())};
  if (const auto& system = line.system())
    result.system = protocol::System{within(system->name(), kLongestTitle), shieldOf(system->artwork())};
  for (const TransitIncidentRef& incident : line.incidents()) result.incidents.push_back(incidentOf(*incident));
  return result;
}

ErrorRef failure(std::string reason) {
  return Error::errorWithDomain_code_reason(std::string(kHandoffErrorDomain), 0, std::move(reason));
}

/// A NimboActivity.
Outcome<ObjectRef> readRecord(std::span<const std::uint8_t> bytes) {
  if (bytes.size() > kMaximumHandoffSize)
    return failure("the activity record has more than " + std::to_string(kMaximumHandoffSize) + " bytes");
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
  return ObjectRef(activity);
}

/// A list of StoredTransitIncident, or an NBTransitIncidentViewControllerState.
Outcome<ObjectRef> readArchive(std::span<const std::uint8_t> bytes) {
  const auto opened = CBORKeyedArchive::openData(bytes);
  if (!opened) return opened.error();
  KeyedUnarchiver& unarchiver = **opened;
  const ArchivableClass& stateClass = NBTransitIncidentViewControllerState::archivedClass();
  unarchiver.setClass_forClassName(stateClass, kEarlierStateClassName);
  unarchiver.setDecodingFailurePolicy(DecodingFailurePolicy::setErrorAndReturn);
  const auto [root, error] = unarchiver.decodeTopLevelObjectOfClasses_forKey(
      {&kArrayClass, &StoredTransitIncident::archivedClass(), &stateClass}, kKeyedArchiveRootObjectKey);
  if (error) return error;
  if (!root) return failure("the archive's root holds neither a list of incidents nor a state with a result");
  return root;
}

ErrorRef tooManyIncidents(std::size_t count) {
  if (count <= kMostIncidents) return nullptr;
  return failure("there are " + std::to_string(count) + " incidents, more than " + std::to_string(kMostIncidents));
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

Outcome<ObjectRef> readHandoff(std::span<const std::uint8_t> bytes) {
  if (bytes.empty()) return failure("there are no bytes");
  if (isMap(bytes)) return readArchive(bytes);
  if (!isBzip2Stream(bytes)) return readRecord(bytes);
  const auto record = bzip2DecompressedData(bytes, kMaximumHandoffSize);
  return record ? readRecord(*record) : record.error();
}

}  // namespace

Outcome<protocol::Handoff> decodeHandoff(std::span<const std::uint8_t> bytes) {
  const Outcome<ObjectRef> content = readHandoff(bytes);
  if (!content) return content.error();
  protocol::Handoff handoff;
  std::string name((*content)->className());
  if (const auto* activity = dynamic_cast<const NimboActivity*>(content->get())) {
    if (activity->hasLineItem()) {
      if (ErrorRef error = tooManyIncidents(activity->lineItem()->incidents().size())) return error;
      handoff.line = lineOf(*activity->lineItem());
    }
  } else if (const auto* list = dynamic_cast<const BoxedArray*>(content->get())) {
    if (bytes.size() > kMaximumHandoffSize)
      return failure("the list of incidents has more than " + std::to_string(kMaximumHandoffSize) + " bytes");
    if (ErrorRef error = tooManyIncidents(list->elements().size())) return error;
    name = kNimboTransitWidgetIncidentSummaryActivityUserInfoKey;
    handoff.incidents.emplace();
    for (const auto& incident : list->elementsOfClass<StoredTransitIncident>())
      handoff.incidents->push_back(incidentOf(*incident));
  }
  // Records keep texts as they were sent: what is not UTF-8 is shown as U+FFFD.
  handoff.text = json{{name, jsonOf(*content)}}.dump(2, ' ', false, json::error_handler_t::replace);
  return handoff;
}

}  // namespace nimbo
