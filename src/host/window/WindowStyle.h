#pragma once

#include <string>

#include "platform/ui/Environment.h"

namespace nimbo {

/// The style sheet of the application's windows, texts larger by `textScale` than the desktop has them.
std::string windowStyle(Appearance appearance, double textScale);

}  // namespace nimbo
