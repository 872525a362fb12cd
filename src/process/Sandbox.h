#pragma once

#include <filesystem>
#include <span>

#include "platform/foundation/Error.h"

namespace nimbo {

/// Closes inherited descriptors but the three standard ones and `kept`, where that is none.
void closeInheritedDescriptors(int kept);

/// Takes from this process, for good, what a widget never does and an intruder would: starting programs and processes,
/// gaining privileges, reaching into other processes, mounting, taking connections, typing into its terminal, memory
/// that is both writable and executable, sockets of other families than local, IP and netlink; and, where the kernel
/// has Landlock, changing files and folders other than those below `writable` and seeing other processes' memory and
/// descriptors. What is tried all the same fails with EPERM or EACCES; of `writable` what does not exist is not
/// writable later either. To be called before the first thread starts. Null on success; else what the kernel does not
/// offer: the process can go on without it.
ErrorRef giveUpPrivileges(std::span<const std::filesystem::path> writable);

/// Domain of the errors of `giveUpPrivileges`; the codes are errno values.
inline constexpr std::string_view kSandboxErrorDomain = "SandboxErrorDomain";

}  // namespace nimbo
