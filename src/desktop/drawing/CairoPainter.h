#pragma once

#include <cstddef>

#include "platform/ui/Painter.h"

typedef struct _cairo cairo_t;

namespace nimbo {

/// Paints on a Cairo context: a picture's or a window's. Texts are those of a PangoTextSystem, images are CairoImages;
/// others throw std::invalid_argument.
class CairoPainter final : public Painter {
 public:
  /// `context` outlives the painter; its user unit is the point.
  explicit CairoPainter(cairo_t* context) : _context(context) {}

  void fillRect(const Rect& rect, const Color& color) override;
  void drawText(const TextLayout& layout, Point origin, double width, const Color& color) override;
  void drawImage(const Image& image, const Rect& rect, double alpha, const Color& tint) override;
  void save(Point offset, const Rect& clip) override;
  /// Throws std::logic_error without a `save` to end.
  void restore() override;

 private:
  cairo_t* _context;
  std::size_t _saved = 0;
};

}  // namespace nimbo
