#pragma once

#include "desktop/drawing/CairoSurface.h"
#include "desktop/drawing/DrawingPart.h"

namespace nimbo {

/// A picture of `size` points at `scale` device pixels a point, over `background`. Errors are those of
/// `CairoSurface::make`. Main thread.
Outcome<CairoSurfaceRef> renderToSurface(const DrawOperation& draw, Size size, double scale, const Color& background);

/// The same as a PNG file at `path`, replaced whole or not at all. Null on success.
ErrorRef renderToPNG(const DrawOperation& draw, Size size, double scale, const Color& background,
                     const std::filesystem::path& path);

}  // namespace nimbo
