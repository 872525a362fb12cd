#pragma once

#include "desktop/drawing/CairoSurface.h"
#include "platform/artwork/Image.h"

namespace nimbo {

/// An image as pixels in memory.
class CairoImage final : public Image {
 public:
  /// The surface is not null and not drawn on any more.
  explicit CairoImage(std::shared_ptr<const CairoSurface> surface) : _surface(std::move(surface)) {}

  Size size() const override { return _surface->size(); }
  double scale() const override { return _surface->scale(); }
  const CairoSurface& surface() const { return *_surface; }

  std::string_view className() const override { return "CairoImage"; }

 private:
  std::shared_ptr<const CairoSurface> _surface;
};

}  // namespace nimbo
