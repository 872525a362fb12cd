#pragma once

#include <optional>
#include <span>

#include "platform/foundation/Boxed.h"

namespace nimbo {

/// The bytes as a bzip2 stream, or absent when compression fails.
std::optional<Bytes> bzip2CompressedData(std::span<const std::uint8_t> bytes);

}  // namespace nimbo
