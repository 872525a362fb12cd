#pragma once

#include <optional>

namespace nimbo {

// Lengths are points: 1/72 inch on paper, one device pixel at a screen scale of 1. The origin is at the top left.

struct Point {
  double x = 0, y = 0;
  bool operator==(const Point&) const = default;
};

struct Size {
  double width = 0, height = 0;
  bool operator==(const Size&) const = default;
};

struct Rect {
  double x = 0, y = 0, width = 0, height = 0;
  Size size() const { return {width, height}; }
  double maxX() const { return x + width; }
  double maxY() const { return y + height; }
  bool contains(Point point) const { return point.x >= x && point.x < maxX() && point.y >= y && point.y < maxY(); }
  bool operator==(const Rect&) const = default;
};

struct Insets {
  double top = 0, left = 0, bottom = 0, right = 0;
  bool operator==(const Insets&) const = default;
};

/// The size that a view's content wants, in points; absent where it does not care.
struct ContentSize {
  std::optional<double> width;
  std::optional<double> height;
  double firstLineHeight = 0;  ///< what of the height is given up last
  bool operator==(const ContentSize&) const = default;
};

}  // namespace nimbo
