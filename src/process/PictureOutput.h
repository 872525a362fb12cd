#pragma once

#include <cstdint>

#include "desktop/drawing/DrawingPart.h"

namespace nimbo {

/// Puts a picture's pixels, row by row, into the memory that the host shares with this process, which keeps its size:
/// `offset` bytes from its beginning on, and no more than `capacity`. Null on success; an error where the picture does
/// not fit, or `memory` is no open file.
ErrorRef writePicture(const Picture& picture, int memory, std::uint64_t offset, std::uint64_t capacity);

}  // namespace nimbo
