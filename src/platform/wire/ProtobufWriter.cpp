#include "platform/wire/ProtobufWriter.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <utility>

#include "platform/wire/CodableRecord.h"
#include "platform/wire/WireType.h"

namespace nimbo {

namespace {

std::size_t lengthOfVarint(std::uint64_t value) {
  return (static_cast<std::size_t>(std::bit_width(value | 1)) + 6) / 7;
}

std::uint8_t* putVarint(std::uint8_t* to, std::uint64_t value) {
  for (; value >= 0x80; value >>= 7) *to++ = static_cast<std::uint8_t>(value | 0x80);
  *to++ = static_cast<std::uint8_t>(value);
  return to;
}

}  // namespace

void ProtobufWriter::reserve(std::size_t count) {
  constexpr std::size_t kFirstSize = 1024;
  if (_buffer.size() - _size < count) _buffer.resize(std::max(kFirstSize, 2 * (_buffer.size() + count)));
}

void ProtobufWriter::writeVarint(std::uint64_t value) {
  reserve(kMaximumVarintLength);
  _size = static_cast<std::size_t>(putVarint(_buffer.data() + _size, value) - _buffer.data());
}

void ProtobufWriter::writeVarintField(std::uint64_t value, std::uint32_t wireType, std::uint32_t field) {
  writeVarint(std::uint64_t{field} << 3 | wireType);
  writeVarint(value);
}

void ProtobufWriter::writeBool(bool value, std::uint32_t field) { writeVarintField(value, kWireTypeVarint, field); }

void ProtobufWriter::writeInt32(std::int32_t value, std::uint32_t field) { writeInt64(value, field); }

void ProtobufWriter::writeInt64(std::int64_t value, std::uint32_t field) {
  writeVarintField(static_cast<std::uint64_t>(value), kWireTypeVarint, field);
}

void ProtobufWriter::writeUInt32(std::uint32_t value, std::uint32_t field) { writeUInt64(value, field); }

void ProtobufWriter::writeUInt64(std::uint64_t value, std::uint32_t field) {
  writeVarintField(value, kWireTypeVarint, field);
}

void ProtobufWriter::writeDouble(double value, std::uint32_t field) {
  writeVarint(std::uint64_t{field} << 3 | kWireType64Bit);
  reserve(sizeof value);
  const auto bits = std::bit_cast<std::uint64_t>(value);
  for (unsigned shift = 0; shift < 64; shift += 8) _buffer[_size++] = static_cast<std::uint8_t>(bits >> shift);
}

void ProtobufWriter::writeString(std::string_view value, std::uint32_t field) {
  writeVarintField(value.size(), kWireTypeLengthDelimited, field);
  reserve(value.size());
  if (!value.empty()) std::memcpy(_buffer.data() + _size, value.data(), value.size());
  _size += value.size();
}

void ProtobufWriter::writeSubmessage(const CodableRecord& record, std::uint32_t field) {
  const std::size_t contentStart = beginMessage(field);
  record.writeTo(*this);
  endMessage(contentStart);
}

std::size_t ProtobufWriter::beginMessage(std::uint32_t field) {
  // One byte for the length: most messages are short, and a long one is moved by the byte or two that it lacks.
  writeVarintField(0, kWireTypeLengthDelimited, field);
  return _size;
}

void ProtobufWriter::endMessage(std::size_t contentStart) {
  const std::size_t length = _size - contentStart;
  const std::size_t more = lengthOfVarint(length) - 1;
  if (more > 0) {
    reserve(more);
    std::uint8_t* content = _buffer.data() + contentStart;
    std::memmove(content + more, content, length);
    _size += more;
  }
  putVarint(_buffer.data() + contentStart - 1, length);
}

Bytes ProtobufWriter::takeBytes() {
  _buffer.resize(_size);
  _size = 0;
  return std::exchange(_buffer, {});
}

}  // namespace nimbo
