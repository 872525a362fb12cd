#pragma once

#include <string>

#include "protocol/Lines.h"

namespace nimbo {

/// How grave an incident is, its effect and its cause, in the user's language; without what says nothing, such as
/// "unknown_cause". Main thread only.
std::string marksOf(const protocol::LineIncident& incident);

}  // namespace nimbo
