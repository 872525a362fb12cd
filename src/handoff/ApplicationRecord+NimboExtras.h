#pragma once

#include "platform/UserActivity.h"

namespace nimbo {

/// Domain of a process that the system knows no bundle of.
inline constexpr std::string_view kNimboActivityErrorDomain = "NimboActivityErrorDomain";

/// The application that contains the running program: the program itself, or the one that its extension lives in.
/// Null without an error for a program that belongs to no application; null with an error in `error`, when that is
/// given, where the system knows nothing of the running program.
ApplicationRecordRef _nimbo_containingApplicationProxy(ErrorRef* error);

}  // namespace nimbo
