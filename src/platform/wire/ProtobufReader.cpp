#include "platform/wire/ProtobufReader.h"

#include <algorithm>
#include <bit>

#include "platform/wire/Scalar.h"

namespace nimbo {

namespace {
constexpr std::size_t kMaximumGroupDepth = 100;
}

bool ProtobufReader::fail(const char* reason, std::size_t offset) {
  if (_failureReason) return false;
  _failureReason = reason;
  _failureOffset = offset;
  return false;
}

std::uint64_t ProtobufReader::readLongVarint() {
  const std::size_t available = std::min(_length - _position, kMaximumVarintLength);
  const std::uint8_t* bytes = _bytes + _position;
  std::uint64_t value = 0;
  for (std::size_t index = 0; index < available; ++index) {
    value |= std::uint64_t{bytes[index] & 0x7fu} << (7 * index);
    if (bytes[index] < 0x80) {
      _position += index + 1;
      return value;
    }
  }
  if (available < kMaximumVarintLength) fail("the bytes end inside a number", _position);
  _position += available;
  return 0;
}

double ProtobufReader::readDouble() {
  if (_length - _position < sizeof(double)) {
    fail("the bytes end inside a number", _position);
    return 0;
  }
  std::uint64_t bits = 0;
  for (unsigned shift = 0; shift < 64; shift += 8) bits |= std::uint64_t{_bytes[_position++]} << shift;
  return std::bit_cast<double>(bits);
}

bool ProtobufReader::skipBytes(std::size_t count) {
  if (count > _length - _position) return fail("the bytes end inside an unknown field", _position);
  _position += count;
  return true;
}

bool ProtobufReader::skipValueWithTag(std::uint32_t field, std::uint32_t wireType) {
  std::vector<std::uint32_t> openGroups;
  for (;;) {
    const std::size_t start = _position;
    switch (wireType) {
      case kWireTypeVarint:
        readVarint();
        break;
      case kWireType64Bit:
        skipBytes(8);
        break;
      case kWireType32Bit:
        skipBytes(4);
        break;
      case kWireTypeLengthDelimited:
        if (const auto mark = placeMark()) recallMark(*mark);
        break;
      case kWireTypeStartGroup:
        if (openGroups.size() == kMaximumGroupDepth) return fail("groups are nested too deep", start);
        openGroups.push_back(field);
        break;
      case kWireTypeEndGroup:
        if (openGroups.empty() || openGroups.back() != field) return fail("a group is closed that is not open", start);
        openGroups.pop_back();
        break;
      default:
        return fail("the wire type is unknown", start);
    }
    if (hasError()) return false;
    if (openGroups.empty()) return true;
    const std::uint64_t tag = readVarint();
    if (hasError()) return false;
    field = static_cast<std::uint32_t>(tag >> 3);
    wireType = static_cast<std::uint32_t>(tag & 7);
  }
}

std::string ProtobufReader::failureText() const {
  if (!_failureReason) return {};
  std::string text;
  for (auto name = _failedFields.rbegin(); name != _failedFields.rend(); ++name)
    text += (text.empty() ? "" : ".") + *name;
  if (!text.empty()) text += ": ";
  return text + _failureReason + ", at byte " + std::to_string(_failureOffset);
}

}  // namespace nimbo
