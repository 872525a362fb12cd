#pragma once

#include "platform/foundation/Geometry.h"
#include "platform/foundation/Object.h"

namespace nimbo {

/// A drawn picture, ready to be painted at one screen scale. Immutable; the pixels belong to the platform's drawing.
class Image : public Object {
 public:
  /// Points.
  virtual Size size() const = 0;
  /// Device pixels for each point.
  virtual double scale() const = 0;
};

using ImageRef = std::shared_ptr<const Image>;

}  // namespace nimbo
