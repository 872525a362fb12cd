#pragma once

#include <cstdint>
#include <protozero/pbf_message.hpp>
#include <string_view>

namespace nimbo {

// Field numbers and enumerations of GTFS-Realtime, as far as alerts need them.
// Source: https://gtfs.org/documentation/realtime/proto/ (package transit_realtime).

enum class FeedMessageField : std::uint32_t { header = 1, entity = 2 };

enum class FeedHeaderField : std::uint32_t { gtfsRealtimeVersion = 1, incrementality = 2, timestamp = 3 };

/// FeedHeader.Incrementality.
inline constexpr std::int32_t kIncrementalityDifferential = 1;

enum class FeedEntityField : std::uint32_t { id = 1, isDeleted = 2, tripUpdate = 3, vehicle = 4, alert = 5 };

enum class AlertField : std::uint32_t {
  activePeriod = 1,
  communicationPeriod = 2,  // since 2026
  impactPeriod = 3,         // since 2026
  informedEntity = 5,
  cause = 6,
  effect = 7,
  url = 8,
  headerText = 10,
  descriptionText = 11,
  severityLevel = 14,
  image = 15,
  imageAlternativeText = 16,
  effectDetail = 18,
};

enum class TimeRangeField : std::uint32_t { start = 1, end = 2 };

enum class EntitySelectorField : std::uint32_t {
  agencyID = 1,
  routeID = 2,
  routeType = 3,
  trip = 4,
  stopID = 5,
  directionID = 6,
};

enum class TripDescriptorField : std::uint32_t { tripID = 1, routeID = 5 };

enum class TranslatedStringField : std::uint32_t { translation = 1 };

enum class TranslationField : std::uint32_t { text = 1, language = 2 };

enum class TranslatedImageField : std::uint32_t { localizedImage = 1 };

enum class LocalizedImageField : std::uint32_t { url = 1, mediaType = 2, language = 3 };

/// Alert.Effect.
enum class AlertEffect : std::int32_t {
  noService = 1,
  reducedService = 2,
  significantDelays = 3,
  detour = 4,
  additionalService = 5,
  modifiedService = 6,
  otherEffect = 7,
  unknownEffect = 8,
  stopMoved = 9,
  noEffect = 10,
  accessibilityIssue = 11,
};

/// Alert.Cause: the least and greatest that are known, and the one for the others.
inline constexpr std::int32_t kLeastCause = 1, kGreatestCause = 13;
inline constexpr std::int32_t kUnknownCause = 1;

/// Alert.SeverityLevel: the one for those that are not known, and the greatest.
inline constexpr std::int32_t kUnknownSeverity = 1, kSeveritySevere = 4;

// How GTFS-Realtime messages are gone through: fields of an unexpected wire type are passed over like unknown ones, but
// for those that say good service where they are missing.

/// The present field as a text, bytes or a message; empty, and the field passed over, when it is of another wire type.
template <class Message>
std::string_view takeView(Message& message) {
  if (message.wire_type() != protozero::pbf_wire_type::length_delimited) {
    message.skip();
    return {};
  }
  const protozero::data_view view = message.get_view();
  return {view.data(), view.size()};
}

/// The present field as a number; 0, and the field passed over, when it is of another wire type.
template <class Message>
std::uint64_t takeNumber(Message& message) {
  if (message.wire_type() != protozero::pbf_wire_type::varint) {
    message.skip();
    return 0;
  }
  return message.get_uint64();
}

/// The present field as a text, bytes or a message. Throws protozero::exception when it is of another wire type.
template <class Message>
std::string_view takeRequiredView(Message& message) {
  if (message.wire_type() != protozero::pbf_wire_type::length_delimited)
    throw protozero::unknown_pbf_wire_type_exception();
  return takeView(message);
}

/// The present field as a number. Throws protozero::exception when it is of another wire type.
template <class Message>
std::uint64_t takeRequiredNumber(Message& message) {
  if (message.wire_type() != protozero::pbf_wire_type::varint) throw protozero::unknown_pbf_wire_type_exception();
  return takeNumber(message);
}

/// A reader of the message in these bytes by its field enumeration.
template <class Field>
protozero::pbf_message<Field> messageIn(std::string_view bytes) {
  return protozero::pbf_message<Field>(bytes.data(), bytes.size());
}

}  // namespace nimbo
