#pragma once

#include <fcntl.h>
#include <sys/file.h>

#include <cerrno>
#include <filesystem>

#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

/// Keeps every other FolderLock on the same folder waiting, in this and in other processes. Locks nothing where the
/// folder cannot be opened or its file system has no locks.
class FolderLock final {
 public:
  explicit FolderLock(const std::filesystem::path& folder)
      : _folder(::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)) {
    if (!_folder) return;
    while (::flock(_folder.get(), LOCK_EX) != 0 && errno == EINTR) {
    }
  }

 private:
  FileDescriptor _folder;
};

}  // namespace nimbo
