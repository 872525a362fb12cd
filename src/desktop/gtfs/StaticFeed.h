#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "desktop/gtfs/RouteType.h"
#include "platform/foundation/Date.h"

namespace nimbo {

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
  /// In the order of routes.txt; `index` is below the count.
  StaticLine line(std::size_t index) const;

  /// The language in which the feed is written, as a BCP 47 tag; empty where it does not say.
  std::string_view language() const;
  /// What the source was when the feed was read from it.
  std::string_view fingerprint() const;
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
