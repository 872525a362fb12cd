#include "platform/wire/ProtobufReader.h"

#include <bit>
#include <ranges>

#include "platform/wire/WireType.h"

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
  const std::size_t start = _position;
  std::uint64_t value = 0;
  for (unsigned shift = 0; shift < 7 * kMaximumVarintLength; shift += 7) {
    if (_position >= _length) {
      fail("the bytes end inside a number", start);
      return 0;
    }
    const std::uint8_t byte = _bytes[_position++];
    value |= std::uint64_t{byte & 0x7fu} << shift;
    if (byte < 0x80) return value;
  }
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

std::optional<std::string_view> ProtobufReader::readString() {
  const auto mark = placeMark();
  if (!mark) return std::nullopt;
  const std::string_view text(reinterpret_cast<const char*>(_bytes) + _position, _length - _position);
  recallMark(*mark);
  return text;
}

std::optional<ProtobufReader::Mark> ProtobufReader::placeMark() {
  const std::size_t start = _position;
  const std::uint64_t length = readVarint();
  if (hasError()) return std::nullopt;
  if (length > _length - _position) {
    fail("the length exceeds the bytes that follow", start);
    return std::nullopt;
  }
  const Mark mark{_position + static_cast<std::size_t>(length), _length};
  _length = mark.end;
  return mark;
}

void ProtobufReader::recallMark(const Mark& mark) {
  _position = mark.end;
  _length = mark.outerLength;
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
  for (const std::string& name : std::views::reverse(_failedFields)) text += (text.empty() ? "" : ".") + name;
  if (!text.empty()) text += ": ";
  return text + _failureReason + ", at byte " + std::to_string(_failureOffset);
}

}  // namespace nimbo
