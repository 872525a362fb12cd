#pragma once

#include <cstdint>
#include <string_view>

namespace nimbo {

/// Multiplier of the value hashes: 2^32 divided by the golden ratio.
inline constexpr std::uint64_t kHashMultiplier = 2654435761;

/// FNV-1a, 64 bits: the same for the same bytes on every machine and in every run.
/// Source: https://datatracker.ietf.org/doc/html/draft-eastlake-fnv
constexpr std::uint64_t hashOfBytes(std::string_view bytes, std::uint64_t seed = 14695981039346656037u) {
  std::uint64_t hash = seed;
  for (char c : bytes) {
    hash ^= static_cast<unsigned char>(c);
    hash *= 1099511628211u;
  }
  return hash;
}

/// Hash of a 64-bit float: its rounded magnitude times `kHashMultiplier`, plus the fraction scaled to 64 bits
/// (a negative fraction counts as 0).
std::uint64_t hashOfDouble(double value);

}  // namespace nimbo
