#pragma once

#include <functional>

#include "desktop/raii/CairoHandles.h"
#include "platform/artwork/Image.h"
#include "platform/ui/Color.h"

namespace nimbo {

/// An image drawn at once on transparent ground; user units are points. Null, and a log line, when it is too large.
ImageRef drawImage(Size size, double scale, const std::function<void(cairo_t*)>& draw);

/// The colour to draw in from now on.
void setColor(cairo_t* context, const Color& color);

}  // namespace nimbo
