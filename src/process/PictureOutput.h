#pragma once

#include "desktop/drawing/DrawingPart.h"

namespace nimbo {

/// Puts a picture's pixels, row by row, at the beginning of the memory that the host shares with this process, which
/// keeps its size. Null on success; an error where the picture does not fit, or `memory` is no open file.
ErrorRef writePicture(const Picture& picture, int memory);

}  // namespace nimbo
