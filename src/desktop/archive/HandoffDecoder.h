#pragma once

#include <optional>
#include <span>
#include <string>

#include "platform/foundation/Error.h"

namespace nimbo {

/// A hand-off or saved state as objects.
struct HandoffContent {
  /// A NimboActivity, an array of StoredTransitIncident, or an NBTransitIncidentViewControllerState; null on failure.
  ObjectRef content;
  ErrorRef error;  ///< null with content; else its reason says what is wrong, and where
};

/// A hand-off or saved state as a text.
struct DecodedHandoff {
  std::optional<std::string> json;  ///< indented, keys sorted, dates as ISO 8601, byte strings in hexadecimal
  ErrorRef error;                   ///< null with a text; else its reason says what is wrong, and where
};

/// Domain of bytes that are neither a hand-off nor a saved state.
inline constexpr std::string_view kHandoffErrorDomain = "HandoffErrorDomain";

/// Reads what the widget hands over or keeps: an activity record, alone or compressed with bzip2 (the value under
/// "bs"), an archived list of incidents (the value under "incidentListKey"), or a saved state. Needs no platform in
/// force; any thread.
HandoffContent readHandoff(std::span<const std::uint8_t> bytes);

/// The same as a text, whose outermost key names which of them it was.
DecodedHandoff decodeHandoff(std::span<const std::uint8_t> bytes);

}  // namespace nimbo
