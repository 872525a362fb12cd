#pragma once

#include "platform/foundation/Error.h"

namespace nimbo {

/// Takes from this process, for good, what a widget never does and an intruder would: starting programs and processes,
/// gaining privileges, reaching into other processes, mounting, listening for connections, typing into its terminal,
/// sockets of other families than local, IP and netlink. What is tried all the same fails with EPERM. Closes inherited
/// descriptors but the three standard ones. To be called before the first thread starts. Null on success; else what the
/// kernel does not offer: the process can go on without it.
ErrorRef giveUpPrivileges();

/// Domain of the errors of `giveUpPrivileges`; the codes are errno values.
inline constexpr std::string_view kSandboxErrorDomain = "SandboxErrorDomain";

}  // namespace nimbo
