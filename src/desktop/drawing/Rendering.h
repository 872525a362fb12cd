#pragma once

#include <filesystem>
#include <functional>

#include "desktop/drawing/CairoSurface.h"
#include "platform/ui/Painter.h"

namespace nimbo {

/// What draws a picture: called once, at once, with the origin at the top left.
using DrawOperation = std::function<void(Painter&)>;

/// A picture of `size` points at `scale` device pixels a point, over `background`. Errors are those of
/// `CairoSurface::make`. Main thread.
Outcome<CairoSurfaceRef> renderToSurface(const DrawOperation& draw, Size size, double scale, const Color& background);

/// The same as a PNG file at `path`, replaced whole or not at all. Null on success.
ErrorRef renderToPNG(const DrawOperation& draw, Size size, double scale, const Color& background,
                     const std::filesystem::path& path);

/// Null on success.
ErrorRef writePNG(const CairoSurface& surface, const std::filesystem::path& path);

}  // namespace nimbo
