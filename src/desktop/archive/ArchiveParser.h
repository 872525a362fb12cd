#pragma once

#include <nlohmann/json.hpp>
#include <span>

#include "platform/foundation/Outcome.h"

namespace nimbo {

/// The values of an archive, not yet objects: its outermost map. Reads CBOR within the bounds of archives: maps with
/// distinct text keys, UTF-8 texts, no tags, nothing after the end. An error for all that is no whole archive of this
/// version.
Outcome<nlohmann::json> parseArchive(std::span<const std::uint8_t> bytes);

}  // namespace nimbo
