#include "peers/BareRows.h"

#include <cmath>

namespace {

constexpr double kMargin = 16, kColumn = 73, kTitleSize = 17, kTextSize = 15, kShieldTextSize = 16.5,
                 kShieldHeight = 30, kShieldPadding = 7.5, kShieldRadius = 7;

void roundedBox(cairo_t* context, double width, double height, double radius) {
  cairo_new_sub_path(context);
  cairo_arc(context, width - radius, radius, radius, -M_PI / 2, 0);
  cairo_arc(context, width - radius, height - radius, radius, 0, M_PI / 2);
  cairo_arc(context, radius, height - radius, radius, M_PI / 2, M_PI);
  cairo_arc(context, radius, radius, radius, M_PI, 3 * M_PI / 2);
  cairo_close_path(context);
}

}  // namespace

BareRows::BareRows(const std::vector<Row>& rows)
    : _context(pango_font_map_create_context(pango_cairo_font_map_get_default())) {
  for (const Row& row : rows) {
    LaidOut laidOut{};
    constexpr double kTextWidth = kWidth - 2 * kMargin - kColumn;
    laidOut.title = layOut(row.title, kTitleSize, PANGO_WEIGHT_BOLD, kTextWidth);
    laidOut.text = layOut(row.text, kTextSize, PANGO_WEIGHT_NORMAL, kTextWidth);
    if (!row.shield.empty()) {
      PangoLayout* text = layOut(row.shield, kShieldTextSize, PANGO_WEIGHT_BOLD, -1);
      int width = 0, height = 0;
      pango_layout_get_pixel_size(text, &width, &height);
      laidOut.shieldWidth = width + 2 * kShieldPadding;
      laidOut.shield = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, static_cast<int>(std::ceil(laidOut.shieldWidth)),
                                                  static_cast<int>(kShieldHeight));
      cairo_t* context = cairo_create(laidOut.shield);
      roundedBox(context, laidOut.shieldWidth, kShieldHeight, kShieldRadius);
      cairo_set_source_rgb(context, row.red, row.green, row.blue);
      cairo_fill(context);
      cairo_set_source_rgb(context, 1, 1, 1);
      cairo_move_to(context, kShieldPadding, (kShieldHeight - height) / 2);
      pango_cairo_show_layout(context, text);
      cairo_destroy(context);
      g_object_unref(text);
    }
    _rows.push_back(laidOut);
  }
}

BareRows::~BareRows() {
  for (const LaidOut& row : _rows) {
    g_object_unref(row.title);
    g_object_unref(row.text);
    if (row.shield) cairo_surface_destroy(row.shield);
  }
  g_object_unref(_context);
}

PangoLayout* BareRows::layOut(const std::string& text, double size, PangoWeight weight, double width) const {
  PangoLayout* layout = pango_layout_new(_context);
  PangoFontDescription* font = pango_font_description_new();
  pango_font_description_set_family_static(font, "sans-serif");
  pango_font_description_set_weight(font, weight);
  pango_font_description_set_absolute_size(font, size * PANGO_SCALE);
  pango_layout_set_font_description(layout, font);
  pango_font_description_free(font);
  pango_layout_set_text(layout, text.data(), static_cast<int>(text.size()));
  if (width > 0) {
    pango_layout_set_width(layout, static_cast<int>(width * PANGO_SCALE));
    pango_layout_set_height(layout, -2);
    pango_layout_set_ellipsize(layout, PANGO_ELLIPSIZE_END);
  }
  return layout;
}

cairo_surface_t* BareRows::draw() const {
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, kWidth, height());
  cairo_t* context = cairo_create(surface);
  cairo_set_source_rgb(context, 1, 1, 1);
  cairo_paint(context);
  double y = 0;
  for (const LaidOut& row : _rows) {
    cairo_set_source_rgb(context, 0, 0, 0);
    cairo_move_to(context, kMargin, y + 24);
    pango_cairo_show_layout(context, row.title);
    cairo_set_source_rgba(context, 0, 0, 0, 0.6);
    cairo_move_to(context, kMargin, y + 48);
    pango_cairo_show_layout(context, row.text);
    if (row.shield) {
      cairo_set_source_surface(context, row.shield, kWidth - kMargin - row.shieldWidth, y + 40);
      cairo_paint(context);
    }
    cairo_set_source_rgba(context, 0, 0, 0, 0.2);
    cairo_rectangle(context, kMargin, y + kRowHeight - 1, kWidth - 2 * kMargin, 1);
    cairo_fill(context);
    y += kRowHeight;
  }
  cairo_destroy(context);
  return surface;
}
