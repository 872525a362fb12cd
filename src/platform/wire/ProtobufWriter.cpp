#include "platform/wire/ProtobufWriter.h"

#include <algorithm>

#include "platform/wire/Record.h"

namespace nimbo {

void ProtobufWriter::grow(std::size_t count) {
  constexpr std::size_t kFirstCapacity = 16384;
  const std::size_t written = size();
  const std::size_t capacity = std::max(kFirstCapacity, 2 * (written + count));
  // Not a vector, which sets its bytes to 0 first.
  auto buffer = std::make_unique_for_overwrite<std::uint8_t[]>(capacity);
  std::uint8_t* end = buffer.get() + capacity;
  if (written > 0) std::memcpy(end - written, _next, written);
  _buffer = std::move(buffer);
  _next = end - written;
  _end = end;
}

void ProtobufWriter::writeDouble(double value, std::uint32_t field) {
  reserve(kMaximumTagLength + sizeof value);
  const auto bits = std::bit_cast<std::uint64_t>(value);
  for (unsigned shift = 64; shift > 0; shift -= 8) *--_next = static_cast<std::uint8_t>(bits >> (shift - 8));
  putTag(field, kWireType64Bit);
}

void ProtobufWriter::writeSubmessage(const CodableRecord& record, std::uint32_t field) {
  const std::size_t begin = beginMessage();
  record.writeTo(*this);
  endMessage(begin, field);
}

Bytes ProtobufWriter::takeBytes() {
  Bytes bytes(_next, _end);
  _next = _end;
  return bytes;
}

}  // namespace nimbo
