#include "desktop/drawing/PangoTextLayout.h"

#include <pango/pangocairo.h>

#include <algorithm>

namespace nimbo {

namespace {

struct IterDeleter {
  void operator()(PangoLayoutIter* iter) const { pango_layout_iter_free(iter); }
};
using IterHandle = std::unique_ptr<PangoLayoutIter, IterDeleter>;

/// How much wider than itself Pango made the ellipsis that ends a line, to fill the width that the line was given.
int ellipsisPadding(const PangoLayoutLine* line) {
  const GSList* runs = line->runs;
  while (runs && runs->next) runs = runs->next;
  if (!runs) return 0;
  const auto* last = static_cast<const PangoLayoutRun*>(runs->data);
  if (!(last->item->analysis.flags & PANGO_ANALYSIS_FLAG_IS_ELLIPSIS)) return 0;
  int natural = 0;
  for (int i = 0; i < last->glyphs->num_glyphs; ++i) {
    PangoRectangle glyph;
    pango_font_get_glyph_extents(last->item->analysis.font, last->glyphs->glyphs[i].glyph, nullptr, &glyph);
    natural += glyph.width;
  }
  return std::max(0, pango_glyph_string_get_width(last->glyphs) - natural);
}

}  // namespace

PangoTextLayout::PangoTextLayout(GObjectHandle<PangoLayout> layout, double scale, bool rightToLeft, bool wasCut)
    : _layout(std::move(layout)), _scale(scale), _rightToLeft(rightToLeft) {
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
  if (_lineCount == 1) _size.width -= points(ellipsisPadding(pango_layout_get_line_readonly(_layout.get(), 0)));
  _isTruncated = wasCut || pango_layout_is_ellipsized(_layout.get());
}

double PangoTextLayout::points(int pangoUnits) const { return pangoUnits * _scale / PANGO_SCALE; }

void PangoTextLayout::draw(cairo_t* context, Point origin, double width) const {
  const IterHandle iter(pango_layout_get_iter(_layout.get()));
  do {
    PangoRectangle line;
    pango_layout_iter_get_line_extents(iter.get(), nullptr, &line);
    const double x = _rightToLeft ? width - points(line.width) : 0;
    cairo_save(context);
    cairo_translate(context, origin.x + x, origin.y + points(pango_layout_iter_get_baseline(iter.get())));
    cairo_scale(context, _scale, _scale);
    cairo_move_to(context, 0, 0);
    pango_cairo_show_layout_line(context, pango_layout_iter_get_line_readonly(iter.get()));
    cairo_restore(context);
  } while (pango_layout_iter_next_line(iter.get()));
}

}  // namespace nimbo
