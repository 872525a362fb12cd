#pragma once

#include <functional>
#include <string_view>

namespace nimbo {

/// Runs `work` as the outermost frame of a thread, or of a callback from a library: what it throws becomes a log line
/// that names `what`, where a platform is in force, and goes no further.
void runGuarded(std::string_view what, const std::function<void()>& work) noexcept;

}  // namespace nimbo
