#pragma once

#include <optional>
#include <span>

#include "platform/foundation/Boxed.h"

namespace nimbo {

/// The compressor of hand-off payloads.
class Compressor {
 public:
  virtual ~Compressor() = default;
  /// A standard bzip2 stream of the bytes, or absent when compression fails. Any thread.
  virtual std::optional<Bytes> Bzip2Compress(std::span<const std::uint8_t> bytes) = 0;
};

}  // namespace nimbo
