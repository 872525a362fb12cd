#pragma once

#include <string>

#include "platform/foundation/Error.h"

namespace nimbo {

/// What failed and what to do about it, in the user's language; the error's own reason, which tells developers more, is
/// logged. Main thread.
std::string textOfError(const Error& error);

}  // namespace nimbo
