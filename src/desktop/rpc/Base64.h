#pragma once

#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "platform/foundation/Boxed.h"

namespace nimbo {

/// Base64 with padding (RFC 4648, section 4).
std::string base64(std::span<const std::uint8_t> bytes);
std::string base64(std::string_view text);

/// The bytes; absent when the text is no Base64.
std::optional<Bytes> bytesFromBase64(std::string_view text);

}  // namespace nimbo
