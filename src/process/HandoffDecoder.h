#pragma once

#include <span>
#include <string>

#include "platform/foundation/Outcome.h"
#include "protocol/Handoff.h"

namespace nimbo {

/// Domain of bytes that are neither a hand-off nor a saved state.
inline constexpr std::string_view kHandoffErrorDomain = "HandoffErrorDomain";

/// Reads what the widget hands over or keeps: an activity record, alone or compressed with bzip2 (the value under
/// "bs"), an archived list of incidents (the value under "incidentListKey"), or a saved state. Its text has one
/// outermost key, which names which of them it was, below it keys in their order, dates as ISO 8601, byte strings in
/// hexadecimal. What is handed over has 1 MiB unpacked and 5000 incidents at most, else that is an error; of its texts
/// come 500 characters, of descriptions 10,000. Errors say what is wrong, and where. Needs no platform in force; any
/// thread.
Outcome<protocol::Handoff> decodeHandoff(std::span<const std::uint8_t> bytes);

}  // namespace nimbo
