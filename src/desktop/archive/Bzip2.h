#pragma once

#include "platform/SystemServices.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// The compressor of hand-off payloads, through libbz2 with the smallest block size: payloads are far smaller than one
/// block, and a smaller block takes less memory. Any thread.
class Bzip2Compressor final : public Compressor {
 public:
  std::optional<Bytes> Bzip2Compress(std::span<const std::uint8_t> bytes) override;
};

/// Domain of errors of broken bzip2 streams; the codes are libbz2's.
inline constexpr std::string_view kBzip2ErrorDomain = "Bzip2ErrorDomain";

/// The content of one whole bzip2 stream; an error for one that is broken, cut off, followed by other bytes, or that
/// holds more than `maximumSize` bytes. Errors say what is wrong, and where.
Outcome<Bytes> bzip2DecompressedData(std::span<const std::uint8_t> bytes, std::size_t maximumSize);

}  // namespace nimbo
