#pragma once

#include <memory>
#include <string_view>

#include "desktop/drawing/VectorImage.h"

namespace nimbo {

/// Reads "images/NAME.svg" of the program's resources. Null, and a log line, when there is none or it is malformed.
std::shared_ptr<const VectorImage> vectorImageNamed(std::string_view name);

}  // namespace nimbo
