#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace nimbo {

/// Reads fields of the Protocol Buffers wire format. It never reads past its length: running out of bytes sets the
/// error flag, and what is read from then on is 0 or absent. The bytes outlive the reader.
/// Inlined wherever a field is read (docs/performance.md).
/// Source: https://protobuf.dev/programming-guides/encoding/
class ProtobufReader {
 public:
  explicit ProtobufReader(std::span<const std::uint8_t> bytes) : _bytes(bytes.data()), _length(bytes.size()) {}

  /// Offset of the next byte.
  std::size_t position() const { return _position; }
  /// Offset of the end: of the bytes, or of the message that a mark limits the reader to.
  std::size_t length() const { return _length; }
  bool hasError() const { return _failureReason != nullptr; }

  /// Seven bits a byte, the least significant group first. Ten bytes that all say that more follow give 0 and no error.
  [[gnu::always_inline]] std::uint64_t readVarint() {
    if (_position < _length && _bytes[_position] < 0x80) return _bytes[_position++];
    return readLongVarint();
  }
  std::int64_t readInt64() { return static_cast<std::int64_t>(readVarint()); }
  bool readBool() { return readVarint() != 0; }
  double readDouble();
  /// The bytes of a length-delimited field, in place; absent when they are not all there.
  [[gnu::always_inline]] std::optional<std::string_view> readString() {
    const std::optional<std::size_t> length = readLength();
    if (!length) return std::nullopt;
    const std::string_view text(reinterpret_cast<const char*>(_bytes) + _position, *length);
    _position += *length;
    return text;
  }

  /// Where a message that is being read ends, and where its surroundings do.
  struct Mark {
    std::size_t end;
    std::size_t outerLength;
  };

  /// Reads a length and limits the reader to that many bytes; absent, with the error flag set, when they are not there.
  std::optional<Mark> placeMark() {
    const std::optional<std::size_t> length = readLength();
    if (!length) return std::nullopt;
    const Mark mark{_position + *length, _length};
    _length = mark.end;
    return mark;
  }
  /// Goes to the end of the marked message and back to the limit around it.
  void recallMark(const Mark& mark) {
    _position = mark.end;
    _length = mark.outerLength;
  }

  /// Skips the value of a field, groups with all that is in them. False when the wire type is unknown, a group is not
  /// closed by its own end, or groups are nested more than 100 deep.
  bool skipValueWithTag(std::uint32_t field, std::uint32_t wireType);

  // Where and why reading failed, for the one who has to mend the bytes.

  /// Names the field in which reading failed, the innermost first.
  void noteFailedField(std::string_view name) { _failedFields.emplace_back(name); }
  /// Such as "lineItem.incidents.title: the length exceeds the bytes that follow, at byte 120"; empty without a
  /// failure.
  std::string failureText() const;

 private:
  std::uint64_t readLongVarint();
  /// The length of what follows, when that many bytes do follow.
  [[gnu::always_inline]] std::optional<std::size_t> readLength() {
    const std::size_t start = _position;
    const std::uint64_t length = readVarint();
    if (length > _length - _position) [[unlikely]]
      fail("the length exceeds the bytes that follow", start);
    return hasError() ? std::nullopt : std::optional(static_cast<std::size_t>(length));
  }
  bool skipBytes(std::size_t count);
  /// Keeps the first failure; false.
  bool fail(const char* reason, std::size_t offset);

  const std::uint8_t* _bytes;
  std::size_t _position = 0;
  std::size_t _length;
  const char* _failureReason = nullptr;  ///< of the first failure; a literal
  std::size_t _failureOffset = 0;
  std::vector<std::string> _failedFields;
};

}  // namespace nimbo
