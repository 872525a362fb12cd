#include "desktop/system/AtomicFile.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <string>
#include <system_error>

#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

namespace {

std::string_view adviceFor(int errnoValue) {
  switch (errnoValue) {
    case ENOSPC:
    case EDQUOT:
      return "Free some space and try again.";
    case EACCES:
    case EPERM:
      return "Check that you may read and write there.";
    case EROFS:
      return "Choose a folder that can be written to.";
    case ENOENT:
      return "Check that the path is right.";
    case EISDIR:
    case ENOTDIR:
    case EEXIST:
      return "Something else stands at this path: move it away or choose another path.";
    case EMFILE:
    case ENFILE:
      return "Too many files are open: close some programs and try again.";
    default:
      return "Check the disk that holds it.";
  }
}

/// 0, or the errno value of what failed.
int writeWhole(int fd, std::string_view bytes) {
  while (!bytes.empty()) {
    const ssize_t count = ::write(fd, bytes.data(), bytes.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) return errno;
    bytes.remove_prefix(static_cast<std::size_t>(count));
  }
  return ::fsync(fd) == 0 ? 0 : errno;
}

}  // namespace

ErrorRef fileError(std::string_view action, const std::filesystem::path& path, int errnoValue) {
  std::string reason = "Cannot ";
  reason.append(action).append(" ").append(path.native()).append(": ");
  reason.append(std::generic_category().message(errnoValue)).append(". ").append(adviceFor(errnoValue));
  return Error::errorWithDomain_code_reason(std::string(kFileErrorDomain), errnoValue, std::move(reason),
                                            path.native());
}

ErrorRef makeFolders(const std::filesystem::path& folder) {
  if (folder.empty()) return nullptr;
  std::error_code ignored;
  if (std::filesystem::is_directory(folder, ignored)) return nullptr;
  if (folder.has_parent_path() && folder.parent_path() != folder)
    if (ErrorRef error = makeFolders(folder.parent_path())) return error;
  if (::mkdir(folder.c_str(), 0700) == 0) return nullptr;
  const int failure = errno;
  // Another process may have been quicker, and "a/" names the same folder as "a".
  if (failure == EEXIST && std::filesystem::is_directory(folder, ignored)) return nullptr;
  return fileError("make the folder", folder, failure);
}

ErrorRef writeFileAtomically(const std::filesystem::path& path, std::string_view bytes) {
  std::error_code ignored;
  std::filesystem::path target = path;
  if (std::filesystem::is_symlink(path, ignored))
    if (auto resolved = std::filesystem::canonical(path, ignored); !ignored) target = std::move(resolved);
  const std::filesystem::path folder = target.has_parent_path() ? target.parent_path() : ".";
  if (ErrorRef error = makeFolders(folder)) return error;

  std::string temporary = target.native() + ".XXXXXX";
  const FileDescriptor file(::mkostemp(temporary.data(), O_CLOEXEC));  // made with mode 0600
  if (!file) return fileError("write", path, errno);
  int failure = writeWhole(file.get(), bytes);
  if (failure == 0 && ::rename(temporary.c_str(), target.c_str()) != 0) failure = errno;
  if (failure != 0) {
    ::unlink(temporary.c_str());
    return fileError("write", path, failure);
  }
  // The new name must outlive a crash too; file systems that cannot sync a folder have nothing better to offer.
  if (const FileDescriptor opened{::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)}) ::fsync(opened.get());
  return nullptr;
}

}  // namespace nimbo
