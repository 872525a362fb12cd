#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "platform/foundation/Boxed.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Log.h"

namespace nimbo {

/// The wall clock. Any thread.
class Clock {
 public:
  virtual ~Clock() = default;
  virtual Date now() const = 0;
};

/// The present moment by the clock of the platform in force.
Date currentDate();

/// Seconds from now to `date`: positive when it lies in the future.
TimeInterval intervalFromNow(Date date);

/// Uniform random numbers. Main thread only.
class RandomSource {
 public:
  virtual ~RandomSource() = default;
  virtual std::uint32_t next() = 0;
};

/// Whether the device is locked.
class DeviceLockState {
 public:
  virtual ~DeviceLockState() = default;
  /// 1 and 2 mean locked; 0 unlocked, also when it cannot be asked. Main thread only.
  virtual int getDeviceLockState() = 0;
};

/// Why the network does not answer. The numbers are those of the error texts.
enum class NetworkFailure { unknown = 0, airplaneMode = 1, cellularDataDisabled = 2, noInternet = 3, other = 4 };

/// Looks at the device's network condition.
class NetworkFailureDiagnosis {
 public:
  virtual ~NetworkFailureDiagnosis() = default;
  /// The condition at this moment. Quick; main thread.
  virtual NetworkFailure diagnose() const = 0;
};

/// The compressor of hand-off payloads.
class Compressor {
 public:
  virtual ~Compressor() = default;
  /// A standard bzip2 stream of the bytes, or absent when compression fails. Any thread.
  virtual std::optional<Bytes> Bzip2Compress(std::span<const std::uint8_t> bytes) = 0;
};

/// Identifier of the map application that the widget belongs to: prefix of its activities and queue labels.
inline constexpr std::string_view kHostApplicationIdentifier = "org.nimbo.Map";

/// URL scheme that the map application opens.
inline constexpr std::string_view kHostApplicationURLScheme = "nimbo";

/// Activity that opens the map application at one line.
inline const std::string kNimboTransitWidgetIncidentActivityType =
    std::string(kHostApplicationIdentifier) + ".Transit.Incident";

/// User-info key of the line: a bzip2 stream of an activity record.
inline constexpr std::string_view kNimboTransitWidgetIncidentActivityUserInfoKey = "bs";

/// Activity that opens the map application at a list of incidents.
inline const std::string kNimboTransitWidgetIncidentSummaryActivityType =
    std::string(kHostApplicationIdentifier) + ".Transit.IncidentList";

/// User-info key of the list's incidents: a keyed archive.
inline constexpr std::string_view kNimboTransitWidgetIncidentSummaryActivityUserInfoKey = "incidentListKey";

/// Logging subsystem of the map application's suggestions, to which the memory-pressure signposts belong.
inline constexpr std::string_view kHostSuggestionsLogSubsystem = "org.nimbo.Map.suggestions";

/// The performance log: named point events.
class Signposts {
 public:
  virtual ~Signposts() = default;
  /// Any thread.
  virtual void event(const LogFacility& facility, std::string_view name, std::string_view message) = 0;
};

}  // namespace nimbo
