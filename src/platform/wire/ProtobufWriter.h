#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "platform/foundation/Boxed.h"

namespace nimbo {

class CodableRecord;

/// Writes fields in the Protocol Buffers wire format, in the order of the calls, into one buffer.
/// Source: https://protobuf.dev/programming-guides/encoding/
class ProtobufWriter {
 public:
  void writeBool(bool value, std::uint32_t field);
  void writeInt32(std::int32_t value, std::uint32_t field);
  void writeInt64(std::int64_t value, std::uint32_t field);
  void writeUInt32(std::uint32_t value, std::uint32_t field);
  void writeUInt64(std::uint64_t value, std::uint32_t field);
  /// Eight bytes, little-endian.
  void writeDouble(double value, std::uint32_t field);
  void writeString(std::string_view value, std::uint32_t field);
  /// The record's own output, with its length before it.
  void writeSubmessage(const CodableRecord& record, std::uint32_t field);

  /// Begins a message field; what is written until `endMessage` with the answer is its content.
  std::size_t beginMessage(std::uint32_t field);
  void endMessage(std::size_t contentStart);

  /// What was written. The writer is empty afterwards.
  Bytes takeBytes();

 private:
  void writeVarint(std::uint64_t value);
  void writeVarintField(std::uint64_t value, std::uint32_t wireType, std::uint32_t field);
  void reserve(std::size_t count);

  Bytes _buffer;          ///< larger than what is written
  std::size_t _size = 0;  ///< bytes written
};

}  // namespace nimbo
