#pragma once

#include "desktop/raii/CairoHandles.h"
#include "platform/ui/TextSystem.h"

typedef struct _cairo cairo_t;
typedef struct _PangoLayout PangoLayout;

namespace nimbo {

/// A text shaped and broken by Pango, measured at one device pixel a point without hinting, so that it is as wide on
/// every screen.
class PangoTextLayout final : public TextLayout {
 public:
  /// `layout` is complete and starts every line at its left edge. `scale`: points for each of its own, above 0.
  /// `wasCut`: text was left out of it already.
  PangoTextLayout(GObjectHandle<PangoLayout> layout, double scale, bool rightToLeft, bool wasCut);

  Size size() const override { return _size; }
  std::size_t lineCount() const override { return _lineCount; }
  double firstBaseline() const override { return _firstBaseline; }
  double lastBaseline() const override { return _lastBaseline; }
  bool isTruncated() const override { return _isTruncated; }

  /// Paints in the context's source colour. User units are points; lines stand within `width` from `origin` on, one
  /// that is wider sticks out at its end.
  void draw(cairo_t* context, Point origin, double width) const;

  std::string_view className() const override { return "PangoTextLayout"; }

 private:
  double points(int pangoUnits) const;

  GObjectHandle<PangoLayout> _layout;
  double _scale;
  bool _rightToLeft;
  Size _size;
  std::size_t _lineCount;
  double _firstBaseline;
  double _lastBaseline;
  bool _isTruncated;
};

}  // namespace nimbo
