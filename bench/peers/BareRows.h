#pragma once

#include <cairo.h>
#include <pango/pangocairo.h>

#include <string>
#include <vector>

/// Rows laid out and drawn with Pango and Cairo and nothing else: the floor for the widget's own.
class BareRows {
 public:
  struct Row {
    std::string title, text, shield;
    double red, green, blue;  // of the shield
  };

  static constexpr int kWidth = 359;
  static constexpr double kRowHeight = 110;

  /// Lays out titles, texts on two lines and shields, and draws the shields into pictures of their own.
  explicit BareRows(const std::vector<Row>& rows);
  ~BareRows();
  BareRows(const BareRows&) = delete;
  BareRows& operator=(const BareRows&) = delete;

  int height() const { return static_cast<int>(kRowHeight * static_cast<double>(_rows.size())); }
  /// Draws all rows into a new picture.
  cairo_surface_t* draw() const;

 private:
  struct LaidOut {
    PangoLayout *title, *text;
    cairo_surface_t* shield;
    double shieldWidth;
  };
  PangoLayout* layOut(const std::string& text, double size, PangoWeight weight, double width) const;

  PangoContext* _context;
  std::vector<LaidOut> _rows;
};
