#pragma once

#include <functional>
#include <map>
#include <string>
#include <tuple>

#include "desktop/drawing/CairoSurface.h"
#include "desktop/raii/CairoHandles.h"
#include "platform/artwork/ArtworkImageSource.h"
#include "platform/ui/Color.h"

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

/// An image drawn at once on transparent ground; user units are points. Null, and a log line, when it is too large.
ImageRef drawImage(Size size, double scale, const std::function<void(cairo_t*)>& draw);

/// The colour to draw in from now on.
void setColor(cairo_t* context, const Color& color);

/// The images of resources/images, drawn as CairoImages. What the images leave to the current colour is drawn in
/// the label's. Drawn images are kept, a missing name is logged once.
class CairoImageResources final : public ImageResources {
 public:
  ImageRef image(std::string_view name, double screenScale, bool nightMode) override;

 private:
  std::map<std::tuple<std::string, double, bool>, ImageRef> _images;
};

}  // namespace nimbo
