#pragma once

#include "protocol/Handoff.h"

namespace nimbo::protocol {

/// A request: its name, what it is asked with, and what is answered.
template <class Params, class Result>
struct Method {
  const char* name;
};

// The requests of the host (docs/protocol.md).
inline constexpr Method<DecodeParams, Handoff> kDecode{"decode"};

}  // namespace nimbo::protocol
