#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>

#include "platform/foundation/Date.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// The bytes of a regular file, at most `limit` of them; a larger one is an error. Errors name the file, what is wrong
/// and what to do.
Outcome<std::string> readFile(const std::filesystem::path& path, std::uint64_t limit);

/// The same of a file of the program's own: of its user, and never reached through a link; its folders may be.
Outcome<std::string> readOwnFile(const std::filesystem::path& path, std::uint64_t limit);

/// What tells one state of a file from another without reading it: its size and when it was last written. Empty when
/// there is none.
std::string fileFingerprint(const std::filesystem::path& path);

/// When the file was last written; absent when there is none.
std::optional<Date> fileChangeDate(const std::filesystem::path& path);
/// Lets it count as written then, a link itself. Null on success.
ErrorRef setFileChangeDate(const std::filesystem::path& path, Date date);

}  // namespace nimbo
