#include "desktop/drawing/CairoPainter.h"

#include <cairo.h>

#include <algorithm>
#include <cmath>
#include <stdexcept>

#include "desktop/drawing/CairoImage.h"
#include "desktop/drawing/PangoTextLayout.h"

namespace nimbo {

namespace {

/// The nearest corner of a device pixel.
Point onPixel(cairo_t* context, Point point) {
  double scaleX = 1, scaleY = 1;
  cairo_surface_get_device_scale(cairo_get_target(context), &scaleX, &scaleY);
  cairo_user_to_device(context, &point.x, &point.y);
  point = {std::round(point.x * scaleX) / scaleX, std::round(point.y * scaleY) / scaleY};
  cairo_device_to_user(context, &point.x, &point.y);
  return point;
}

}  // namespace

void CairoPainter::fillRect(const Rect& rect, const Color& color) {
  setColor(_context, color);
  cairo_rectangle(_context, rect.x, rect.y, rect.width, rect.height);
  cairo_fill(_context);
}

void CairoPainter::drawText(const TextLayout& layout, Point origin, double width, const Color& color) {
  const auto* text = dynamic_cast<const PangoTextLayout*>(&layout);
  if (!text) throw std::invalid_argument("the text was laid out by another text system");
  setColor(_context, color);
  text->draw(_context, origin, width);
}

void CairoPainter::drawImage(const Image& image, const Rect& rect, double alpha, const Color& tint) {
  const auto* picture = dynamic_cast<const CairoImage*>(&image);
  if (!picture) throw std::invalid_argument("the image was drawn by another platform");
  const Size size = image.size();
  if (!(size.width > 0 && size.height > 0 && rect.width > 0 && rect.height > 0)) return;
  const double fit = std::min(rect.width / size.width, rect.height / size.height);

  // Between two pixels an image would be blurred, and slower to draw.
  const Point origin =
      onPixel(_context, {rect.x + (rect.width - size.width * fit) / 2, rect.y + (rect.height - size.height * fit) / 2});
  cairo_save(_context);
  cairo_translate(_context, origin.x, origin.y);
  cairo_scale(_context, fit, fit);
  if (tint.alpha > 0) {
    cairo_set_source_rgba(_context, tint.red, tint.green, tint.blue, tint.alpha * alpha);
    cairo_mask_surface(_context, picture->surface().get(), 0, 0);
  } else {
    cairo_set_source_surface(_context, picture->surface().get(), 0, 0);
    cairo_paint_with_alpha(_context, alpha);
  }
  cairo_restore(_context);
}

void CairoPainter::save(Point offset, const Rect& clip) {
  cairo_save(_context);
  ++_saved;
  cairo_translate(_context, offset.x, offset.y);
  cairo_rectangle(_context, clip.x, clip.y, clip.width, clip.height);
  cairo_clip(_context);
}

void CairoPainter::restore() {
  if (_saved == 0) throw std::logic_error("restore without save");
  --_saved;
  cairo_restore(_context);
}

}  // namespace nimbo
