#pragma once

#include <string>

namespace nimbo {

/// The style sheet of the application's windows, texts larger by `textScale` than the desktop has them.
std::string windowStyle(double textScale);

}  // namespace nimbo
