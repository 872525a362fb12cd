#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

#include "platform/foundation/Geometry.h"
#include "platform/ui/Color.h"

typedef struct _cairo cairo_t;

namespace nimbo {

/// A drawing of filled and stroked shapes, sharp at any size. The images of resources/images become such when the
/// program is built (VectorImageTool.cpp).
struct VectorImage {
  enum class Operation : std::uint8_t { move, line, curve, close, circle };
  struct Step {
    Operation operation;
    std::array<double, 6> values;  ///< the points in order; a circle's centre and radius
  };
  struct Paint {
    bool isUsed;
    std::optional<Color> color;  ///< absent: the current colour
  };
  struct Shape {
    std::span<const Step> steps;
    Paint fill;
    Paint stroke;
    bool fillsEvenOdd;
    double strokeWidth;
  };

  std::string_view name;
  Size size;  ///< points
  std::span<const Shape> shapes;

  /// Draws it to fill `rect`, distorted where the proportions differ. `currentColor` stands for the colour of that
  /// name.
  void draw(cairo_t* context, const Rect& rect, const Color& currentColor) const;
};

/// Null, and a log line, when there is none.
const VectorImage* vectorImageNamed(std::string_view name);

/// All there are. Made by the build.
extern const std::span<const VectorImage> kVectorImages;

}  // namespace nimbo
