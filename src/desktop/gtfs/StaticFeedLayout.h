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

inline constexpr std::uint64_t kFlatFeedMagic = 0x0001544647424D4E;  // version 1
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

/// Tells damage, not malice. Word by word, since the cache must be read much faster than the text it stands for; four
/// sums side by side take a third of the time of one, each step of which waits for the step before.
inline std::uint64_t flatChecksum(std::string_view bytes) {
  constexpr std::uint64_t kMultiplier = 0xFF51AFD7ED558CCD;
  const auto mixed = [](std::uint64_t sum, std::uint64_t word) {
    sum = (sum ^ word) * kMultiplier;
    return sum ^ (sum >> 32);
  };
  std::array<std::uint64_t, 4> sums{bytes.size(), 1, 2, 3};
  std::size_t position = 0;
  while (position + sizeof sums <= bytes.size())
    for (std::uint64_t& sum : sums) {
      sum = mixed(sum, flatRecordAt<std::uint64_t>(bytes, position));
      position += sizeof sum;
    }
  std::uint64_t all = 0x9E3779B97F4A7C15;
  for (const std::uint64_t sum : sums) all = mixed(all, sum);
  for (; position < bytes.size(); ++position) all = mixed(all, static_cast<unsigned char>(bytes[position]));
  return all;
}

}  // namespace nimbo
