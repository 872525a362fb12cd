#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace nimbo {

/// Which line each trip of a static feed runs on. Trips are known by the 64-bit hash of their identifier. A table that
/// is not whole holds no trip: one that it lacks would count as one that there is not.
class TripRoutes {
 public:
  struct Entry {
    std::uint64_t trip;
    std::uint64_t line;  ///< index in the static feed
    bool operator==(const Entry&) const = default;
  };

  void add(std::string_view tripID, std::uint32_t line);
  /// Drops everything: the table is missing, or was not read to its end.
  void giveUp();
  bool isWhole() const { return _isWhole; }
  std::size_t count() const { return _entries.size(); }
  /// To be called after the last `add`.
  void finish();

  /// The index of the trip's line; absent for a trip that is not known. `tripID` is cleaned as an `Identifier`.
  std::optional<std::uint32_t> lineOfTrip(std::string_view tripID) const;

  /// For the cache. `key` tells for which static feed they are good.
  std::string bytes(std::uint64_t key) const;
  /// Absent when the bytes are damaged or of another key; each line is below `lineCount`.
  static std::optional<TripRoutes> fromBytes(std::string_view bytes, std::uint64_t key, std::size_t lineCount);

 private:
  std::vector<Entry> _entries;  // by trip
  bool _isWhole = true;
};

}  // namespace nimbo
