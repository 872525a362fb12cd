#pragma once

#include <array>
#include <cstdint>
#include <cstring>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>

#include "platform/foundation/Date.h"
#include "platform/transit/TransitArtwork.h"

namespace nimbo {

/// A GTFS route_type. Sources: https://gtfs.org/documentation/schedule/reference/#routestxt (0 to 12) and
/// https://developers.google.com/transit/gtfs/reference/extended-route-types (100 to 1799).
using RouteType = int;

/// A line whose route type is missing or no number.
inline constexpr RouteType kUnknownRouteType = -1;

/// The basic type whose extended range holds `type`: 7xx are buses (3). A basic or unknown type is its own.
RouteType basicRouteType(RouteType type);

/// Whether a selector for all lines of `selected` means a line of `type`: the same type, or a basic type and one of
/// its extended ones. 700, which stands for buses as such, also means the basic type; 714 means no other.
bool routeTypeCovers(RouteType selected, RouteType type);

/// Absent knowledge gives TransitMode::unknown.
TransitMode modeOfRouteType(RouteType type);

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

/// An agency of a static feed. The texts live as long as the feed.
struct StaticAgency {
  std::string_view id;                            ///< empty where the feed's only agency has none
  std::string_view name;                          ///< empty where the feed does not say
  TransitMode sharedMode = TransitMode::unknown;  ///< that of all its lines; unknown when they differ
};

/// A line of a static feed. The texts live as long as the feed.
struct StaticLine {
  std::uint64_t muid = 0;
  std::string_view routeID;
  std::string_view shortName;              ///< may be empty
  std::string_view longName;               ///< may be empty
  std::optional<std::uint32_t> color;      ///< 0xRRGGBB; absent when not published
  std::optional<std::uint32_t> textColor;  ///< 0xRRGGBB; absent when not published
  RouteType type = kUnknownRouteType;
  std::uint32_t agency = 0;  ///< index
};

/// The lines and agencies of a GTFS static feed in one flat run of bytes, the same in memory and in the cache: reading
/// it back takes no more than checking it. Immutable; copies share the bytes. The layout is that of this machine and of
/// this version of the program.
class StaticFeed {
 public:
  /// The feed in bytes that `bytes` gave; absent when they are damaged, or of another version or machine.
  static std::optional<StaticFeed> fromBytes(std::string bytes);
  std::string_view bytes() const { return *_bytes; }

  std::size_t agencyCount() const;
  /// One without texts for an index that is not below the count.
  StaticAgency agency(std::size_t index) const;
  std::size_t lineCount() const;
  bool hasRoute(std::string_view routeID) const;
  /// In the order of routes.txt; `index` is below the count.
  StaticLine line(std::size_t index) const;

  /// The language in which the feed is written, as a BCP 47 tag; empty where it does not say.
  std::string_view language() const;
  /// What the source was when the feed was read from it.
  std::string_view fingerprint() const;
  /// Tells it from other feeds, and from other states of itself.
  std::uint64_t checksum() const;
  /// When it was last known that the source has not changed.
  Date checkedAt() const;
  /// The same feed with another `checkedAt`.
  StaticFeed checkedAgainAt(Date date) const;

 private:
  friend class StaticFeedBuilder;
  explicit StaticFeed(std::string bytes) : _bytes(std::make_shared<const std::string>(std::move(bytes))) {}
  std::shared_ptr<const std::string> _bytes;
};

}  // namespace nimbo
