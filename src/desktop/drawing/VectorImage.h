#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/foundation/Geometry.h"
#include "platform/ui/Color.h"

typedef struct _cairo cairo_t;

namespace nimbo {

/// A drawing of filled and stroked shapes, sharp at any size. Immutable.
///
/// Read from a small part of SVG 1.1 (https://www.w3.org/TR/SVG11/): `<svg viewBox="0 0 W H">` with `<path d>` of the
/// commands M L H V C Z, `<circle cx cy r>` and `<rect x y width height rx>` in it; on each `fill`, `fill-rule`,
/// `stroke` and `stroke-width`. A colour is "none", "currentColor" or "#rrggbb". `stroke-linecap` and
/// `stroke-linejoin` must be "round" where they stand, as all strokes are drawn round. Comments and other attributes
/// are passed over; any other element or path command is an error, so that nothing is left out unseen.
class VectorImage final {
 public:
  struct Parsed {
    std::shared_ptr<const VectorImage> image;  ///< null when malformed
    std::string problem;                       ///< what is wrong and where, for developers
  };
  static Parsed parse(std::string_view svg);

  /// Points.
  Size size() const { return _size; }

  /// Draws it to fill `rect`, distorted where the proportions differ. `currentColor` stands for the colour of that
  /// name.
  void draw(cairo_t* context, const Rect& rect, const Color& currentColor) const;

 private:
  friend class VectorImageReader;

  enum class Operation : std::uint8_t { move, line, curve, close, circle };
  struct Step {
    Operation operation;
    std::array<double, 6> values;  // the points in order; a circle's centre and radius
  };
  struct Paint {
    bool isUsed = false;
    std::optional<Color> color;  // absent: the current colour
  };
  struct Shape {
    std::vector<Step> steps;
    Paint fill{true, Color{0, 0, 0, 1}};
    Paint stroke;
    bool fillsEvenOdd = false;
    double strokeWidth = 1;
  };

  VectorImage() = default;

  Size _size;
  std::vector<Shape> _shapes;
};

}  // namespace nimbo
