#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <span>
#include <string>
#include <string_view>

namespace nimbo {

// Wire types of Protocol Buffers. Source: https://protobuf.dev/programming-guides/encoding/#structure

inline constexpr std::uint32_t kWireTypeVarint = 0;
inline constexpr std::uint32_t kWireType64Bit = 1;
inline constexpr std::uint32_t kWireTypeLengthDelimited = 2;
inline constexpr std::uint32_t kWireTypeStartGroup = 3;
inline constexpr std::uint32_t kWireTypeEndGroup = 4;
inline constexpr std::uint32_t kWireType32Bit = 5;

/// Bytes of the longest varint.
inline constexpr std::size_t kMaximumVarintLength = 10;

/// A number or boolean of a record, with its presence. Clearing the presence leaves the value.
template <class T>
struct Scalar {
  T value{};
  bool isPresent = false;

  void set(T newValue) {
    value = newValue;
    isPresent = true;
  }
};

/// The name of an enumeration's value, or its number in words.
inline std::string nameOfValue(std::span<const std::string_view> names, std::int32_t value) {
  if (value >= 0 && static_cast<std::size_t>(value) < names.size())
    return std::string(names[static_cast<std::size_t>(value)]);
  char text[32];
  std::snprintf(text, sizeof text, "(unknown: %i)", static_cast<int>(value));
  return text;
}

/// The value of an enumeration's name; 0 for a text that is none.
inline std::int32_t valueOfName(std::span<const std::string_view> names, std::string_view name) {
  for (std::size_t value = 0; value < names.size(); ++value)
    if (names[value] == name) return static_cast<std::int32_t>(value);
  return 0;
}

/// An enumeration field: any 32-bit value is kept; `Names` holds the names of the values from 0 on.
template <const auto& Names>
struct NamedScalar : Scalar<std::int32_t> {
  /// 0 when absent.
  std::int32_t valueOrZero() const { return isPresent ? value : 0; }
  std::string name() const { return nameOfValue(Names, value); }
};

}  // namespace nimbo
