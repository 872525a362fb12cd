#pragma once

namespace nimbo {

/// The version of the programs, "1.2.3"; CMakeLists.txt has it.
extern const char* const kVersion;

}  // namespace nimbo
