#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <string_view>

#include "platform/foundation/Boxed.h"
#include "platform/wire/Scalar.h"

namespace nimbo {

class CodableRecord;

/// Writes fields in the Protocol Buffers wire format into one buffer, from its end to its start: the calls come in the
/// opposite order of the fields. So the length of a message is known when it is written, after the content that stands
/// behind it. Writing forwards moves what was written, or measures it first.
/// Inlined wherever a field is written; tags are constants (docs/performance.md).
/// Source: https://protobuf.dev/programming-guides/encoding/
class ProtobufWriter {
 public:
  void writeBool(bool value, std::uint32_t field) { writeUInt64(value ? 1 : 0, field); }
  void writeInt32(std::int32_t value, std::uint32_t field) { writeInt64(value, field); }
  void writeInt64(std::int64_t value, std::uint32_t field) { writeUInt64(static_cast<std::uint64_t>(value), field); }
  [[gnu::always_inline]] void writeUInt64(std::uint64_t value, std::uint32_t field) {
    reserve(kMaximumTagLength + kMaximumVarintLength);
    putVarint(value);
    putTag(field, kWireTypeVarint);
  }
  /// Eight bytes, little-endian.
  void writeDouble(double value, std::uint32_t field);
  [[gnu::always_inline]] void writeString(std::string_view value, std::uint32_t field) {
    reserve(kMaximumTagLength + kMaximumVarintLength + value.size());
    _next -= value.size();
    // Null only where there is nothing to copy.
    if (!value.empty()) std::memcpy(_next, value.data(), value.size());
    putVarint(value.size());
    putTag(field, kWireTypeLengthDelimited);
  }
  /// The record's own output, with its length before it.
  void writeSubmessage(const CodableRecord& record, std::uint32_t field);

  /// The content of a message field is what is written between these two.
  std::size_t beginMessage() const { return size(); }
  [[gnu::always_inline]] void endMessage(std::size_t begin, std::uint32_t field) {
    reserve(kMaximumTagLength + kMaximumVarintLength);
    putVarint(size() - begin);
    putTag(field, kWireTypeLengthDelimited);
  }

  /// What was written. The writer is empty afterwards.
  Bytes takeBytes();

 private:
  static constexpr std::size_t kMaximumTagLength = 5;

  std::size_t size() const { return static_cast<std::size_t>(_end - _next); }
  void reserve(std::size_t count) {
    if (static_cast<std::size_t>(_next - _buffer.get()) < count) [[unlikely]]
      grow(count);
  }
  void grow(std::size_t count);
  [[gnu::always_inline]] void putTag(std::uint32_t field, std::uint32_t wireType) {
    putVarint(std::uint64_t{field} << 3 | wireType);
  }
  [[gnu::always_inline]] void putVarint(std::uint64_t value) {
    if (value < 0x80)
      *--_next = static_cast<std::uint8_t>(value);
    else
      putLongVarint(value);
  }
  void putLongVarint(std::uint64_t value) {
    _next -= (static_cast<std::size_t>(std::bit_width(value)) + 6) / 7;
    std::uint8_t* to = _next;
    for (; value >= 0x80; value >>= 7) *to++ = static_cast<std::uint8_t>(value | 0x80);
    *to = static_cast<std::uint8_t>(value);
  }

  std::unique_ptr<std::uint8_t[]> _buffer;
  std::uint8_t* _next = nullptr;  ///< the first byte written; those before it are free
  std::uint8_t* _end = nullptr;
};

}  // namespace nimbo
