#include "desktop/drawing/VectorImage.h"

#include <cairo.h>

#include <algorithm>
#include <numbers>

#include "desktop/drawing/CairoImage.h"
#include "platform/foundation/Log.h"

namespace nimbo {

const VectorImage* vectorImageNamed(std::string_view name) {
  const auto image = std::ranges::find(kVectorImages, name, &VectorImage::name);
  if (image != kVectorImages.end()) return &*image;
  writeLog({kDefaultLogSubsystem, "Images"}, LogLevel::error, "There is no image named %@; nothing is shown for it",
           {name});
  return nullptr;
}

void VectorImage::draw(cairo_t* context, const Rect& rect, const Color& currentColor) const {
  cairo_save(context);
  cairo_translate(context, rect.x, rect.y);
  cairo_scale(context, rect.width / size.width, rect.height / size.height);
  cairo_set_line_cap(context, CAIRO_LINE_CAP_ROUND);
  cairo_set_line_join(context, CAIRO_LINE_JOIN_ROUND);
  for (const Shape& shape : shapes) {
    cairo_new_path(context);
    for (const auto& [operation, v] : shape.steps) {
      switch (operation) {
        case Operation::move:
          cairo_move_to(context, v[0], v[1]);
          break;
        case Operation::line:
          cairo_line_to(context, v[0], v[1]);
          break;
        case Operation::curve:
          cairo_curve_to(context, v[0], v[1], v[2], v[3], v[4], v[5]);
          break;
        case Operation::close:
          cairo_close_path(context);
          break;
        case Operation::circle:
          cairo_new_sub_path(context);
          cairo_arc(context, v[0], v[1], v[2], 0, 2 * std::numbers::pi);
          cairo_close_path(context);
          break;
      }
    }
    const auto setPaint = [&](const Paint& paint) { setColor(context, paint.color.value_or(currentColor)); };
    cairo_set_fill_rule(context, shape.fillsEvenOdd ? CAIRO_FILL_RULE_EVEN_ODD : CAIRO_FILL_RULE_WINDING);
    if (shape.fill.isUsed) {
      setPaint(shape.fill);
      cairo_fill_preserve(context);
    }
    if (shape.stroke.isUsed) {
      setPaint(shape.stroke);
      cairo_set_line_width(context, shape.strokeWidth);
      cairo_stroke(context);
    }
  }
  cairo_new_path(context);
  cairo_restore(context);
}

}  // namespace nimbo
