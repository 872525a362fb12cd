#pragma once

#include <cstdint>

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

/// Alert.SeverityLevel.
inline constexpr std::int32_t kSeveritySevere = 4;

}  // namespace nimbo
