#pragma once

#include <cstddef>
#include <cstdint>

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

}  // namespace nimbo
