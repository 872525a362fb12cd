#pragma once

#include <functional>

#include "desktop/raii/CairoHandles.h"
#include "platform/artwork/Image.h"

namespace nimbo {

/// An image drawn at once on transparent ground; user units are points. Null, and a log line, when it is too large.
ImageRef drawImage(Size size, double scale, const std::function<void(cairo_t*)>& draw);

}  // namespace nimbo
