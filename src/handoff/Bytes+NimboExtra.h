#pragma once

#include "platform/foundation/Boxed.h"

#include <optional>
#include <span>

namespace nimbo {

/// The bytes as a bzip2 stream, or absent when compression fails.
std::optional<Bytes> bzip2CompressedData(std::span<const std::uint8_t> bytes);

}  // namespace nimbo
