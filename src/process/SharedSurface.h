#pragma once

#include <filesystem>

#include "desktop/drawing/DrawingPart.h"

namespace nimbo {

/// Puts a picture's pixels, row by row, into a file that the host made for them (memory that both share, such as
/// "/proc/PID/fd/N"), which takes the size of the picture. Null on success.
ErrorRef writeSharedSurface(const Picture& picture, const std::filesystem::path& path);

}  // namespace nimbo
