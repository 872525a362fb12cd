#pragma once

#include <string>
#include <vector>

namespace nimbo {

/// Starts the window's program, nimbo-transit-desktop, apart from this one: beside it, or as built, or by
/// NIMBO_TRANSIT_DESKTOP, else as found in PATH. `activationToken` is of XDG Activation, or empty. Answers what went
/// wrong, for the user; empty when it was started.
std::string startWindow(const std::vector<std::string>& arguments, const std::string& activationToken = {});

}  // namespace nimbo
