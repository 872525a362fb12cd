#include "handoff/Bytes+NimboExtra.h"
#include "platform/Platform.h"

namespace nimbo {

std::optional<Bytes> bzip2CompressedData(std::span<const std::uint8_t> bytes) {
  return Platform::current().compressor().Bzip2Compress(bytes);
}

}  // namespace nimbo
