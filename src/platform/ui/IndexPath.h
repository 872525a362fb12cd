#pragma once

#include <cstdint>

namespace nimbo {

/// A row of a table.
struct IndexPath {
  std::int64_t section = 0;
  std::int64_t row = 0;
  bool operator==(const IndexPath&) const = default;
};

}  // namespace nimbo
