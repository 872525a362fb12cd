#pragma once

#include <nlohmann/json.hpp>
#include <span>

#include "platform/foundation/Error.h"

namespace nimbo {

/// The values of an archive, not yet objects.
struct ParsedArchive {
  nlohmann::json content;  ///< the outermost map; null with an error
  ErrorRef error;          ///< null when the bytes are a whole archive of this version
};

/// Reads CBOR within the bounds of archives: maps with distinct text keys, UTF-8 texts, no tags, nothing after the end.
ParsedArchive parseArchive(std::span<const std::uint8_t> bytes);

}  // namespace nimbo
