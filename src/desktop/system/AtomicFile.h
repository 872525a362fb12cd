#pragma once

#include <filesystem>
#include <string_view>

#include "platform/foundation/Error.h"

namespace nimbo {

/// Errors of files and folders; the code is the errno value.
inline constexpr std::string_view kFileErrorDomain = "org.nimbo.File";

/// An error of `kFileErrorDomain` whose reason says what could not be done to which file, why, and what to do:
/// "Cannot write /a/b: No space left on device. Free some space and try again."
ErrorRef fileError(std::string_view action, const std::filesystem::path& path, int errnoValue);

/// Makes `folder` and the folders above it that are missing, open to their owner only. Null on success, also when it
/// exists already.
ErrorRef makeFolders(const std::filesystem::path& folder);

/// Replaces what `path` holds with `bytes`, readable and writable by the owner only. Readers, also after a crash, see
/// the old bytes or the new ones, never a mixture; on failure the old file stays. Makes missing folders, and clears
/// what killed processes left half written. A link, or whatever else is no regular file, is an error and stays; the
/// folders above may be links. Null on success. Any thread.
ErrorRef writeFileAtomically(const std::filesystem::path& path, std::string_view bytes);

}  // namespace nimbo
