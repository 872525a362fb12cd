#include "desktop/drawing/PangoTextLayout.h"

#include <pango/pangocairo.h>

#include <algorithm>

namespace nimbo {

namespace {

struct IterDeleter {
  void operator()(PangoLayoutIter* iter) const { pango_layout_iter_free(iter); }
};
using IterHandle = std::unique_ptr<PangoLayoutIter, IterDeleter>;

double points(int pangoUnits) { return static_cast<double>(pangoUnits) / PANGO_SCALE; }

}  // namespace

PangoTextLayout::PangoTextLayout(GObjectHandle<PangoLayout> layout, TextAlignment alignment, bool rightToLeft,
                                 bool wasCut)
    : _layout(std::move(layout)), _alignment(alignment), _rightToLeft(rightToLeft) {
  int width = 0, height = 0;
  pango_layout_get_size(_layout.get(), &width, &height);
  _size = {points(width), points(height)};
  _lineCount = static_cast<std::size_t>(pango_layout_get_line_count(_layout.get()));
  _firstBaseline = _lastBaseline = points(pango_layout_get_baseline(_layout.get()));
  if (_lineCount > 1) {
    const IterHandle iter(pango_layout_get_iter(_layout.get()));
    while (pango_layout_iter_next_line(iter.get())) {
    }
    _lastBaseline = points(pango_layout_iter_get_baseline(iter.get()));
  }
  _isTruncated = wasCut || pango_layout_is_ellipsized(_layout.get());
}

void PangoTextLayout::draw(cairo_t* context, Point origin, double width) const {
  const IterHandle iter(pango_layout_get_iter(_layout.get()));
  do {
    PangoRectangle line;
    pango_layout_iter_get_line_extents(iter.get(), nullptr, &line);
    const double room = width - points(line.width);
    double x = 0;
    if (_alignment == TextAlignment::center && room > 0)
      x = room / 2;
    else if (_rightToLeft)
      x = room;
    cairo_move_to(context, origin.x + x, origin.y + points(pango_layout_iter_get_baseline(iter.get())));
    pango_cairo_show_layout_line(context, pango_layout_iter_get_line_readonly(iter.get()));
  } while (pango_layout_iter_next_line(iter.get()));
}

}  // namespace nimbo
