#pragma once

#include <array>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <type_traits>

namespace nimbo {

// The flat bytes of a StaticFeed: a header, the agencies, the lines, then all texts. Numbers are in the machine's own
// order; the magic number read in another order is not this one.

struct FlatText {
  std::uint32_t offset = 0;  // from the beginning of the texts
  std::uint32_t length = 0;
};

struct FlatAgency {
  FlatText id, name;
  std::int64_t sharedMode = 0;
};

struct FlatLine {
  std::uint64_t muid = 0;
  FlatText routeID, shortName, longName;
  std::uint32_t color = 0, textColor = 0;  // kNoColor when absent
  std::int32_t type = 0;
  std::uint32_t agency = 0;
};

struct FlatHeader {
  std::uint64_t magic = 0;
  std::uint64_t checksum = 0;  // of all bytes after this field
  std::int64_t checkedAt = 0;  // microseconds since 1970
  std::uint32_t agencyCount = 0, lineCount = 0;
  FlatText language, fingerprint;
};

inline constexpr std::uint64_t kFlatFeedMagic = 0x0002544647424D4E;  // version 2
inline constexpr std::uint32_t kNoColor = 0xFFFFFFFF;
inline constexpr std::size_t kFlatChecksumEnd = 2 * sizeof(std::uint64_t);

static_assert(sizeof(FlatAgency) == 24 && sizeof(FlatLine) == 48 && sizeof(FlatHeader) == 48,
              "no padding: every byte is written and checked");

/// The record at a byte position that holds one.
template <class T>
T flatRecordAt(std::string_view bytes, std::size_t position) {
  static_assert(std::is_trivially_copyable_v<T>);
  T record;
  std::memcpy(&record, bytes.data() + position, sizeof record);
  return record;
}

/// Tells damage, not malice: a word that differs always makes another sum. Eight sums side by side, of additions and
/// shifts alone, which the compiler turns into vector instructions (docs/performance.md).
inline std::uint64_t flatChecksum(std::string_view bytes) {
  std::array<std::uint64_t, 8> sums{bytes.size(), 1, 2, 3, 4, 5, 6, 7};
  std::size_t position = 0;
  for (; position + sizeof sums <= bytes.size(); position += sizeof sums)
    for (std::size_t i = 0; i < sums.size(); ++i) {
      sums[i] += flatRecordAt<std::uint64_t>(bytes, position + i * sizeof sums[0]);
      sums[i] ^= sums[i] >> 31;  // else the sum would not tell the order of the words
    }
  std::uint64_t all = 0x9E3779B97F4A7C15;
  const auto mix = [&](std::uint64_t word) {
    all = (all ^ word) * 0xFF51AFD7ED558CCD;
    all ^= all >> 32;
  };
  for (const std::uint64_t sum : sums) mix(sum);
  for (; position < bytes.size(); ++position) mix(static_cast<unsigned char>(bytes[position]));
  return all;
}

}  // namespace nimbo
