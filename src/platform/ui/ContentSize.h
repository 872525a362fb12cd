#pragma once

#include <optional>

namespace nimbo {

/// The size that a view's content wants, in points; absent where it does not care.
struct ContentSize {
  std::optional<double> width;
  std::optional<double> height;
  double firstLineHeight = 0;  ///< what of the height is given up last
  bool operator==(const ContentSize&) const = default;
};

}  // namespace nimbo
