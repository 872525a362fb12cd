#include "desktop/system/AtomicFile.h"

#include <fcntl.h>
#include <sys/file.h>
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
    case ELOOP:
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

/// After the random letters of a temporary file's name: no file of the user's ends so.
constexpr std::string_view kTemporaryEnd = ".nimbo-part";

/// A new file beside `target`, locked as long as it is open, so that a name without a lock is one that a killed process
/// left. Its path goes to `path`. None: errno says why.
FileDescriptor makeTemporary(const std::filesystem::path& target, std::string& path) {
  for (;;) {
    path = target.native() + ".XXXXXX" + std::string(kTemporaryEnd);
    FileDescriptor file(
        ::mkostemps(path.data(), static_cast<int>(kTemporaryEnd.size()), O_CLOEXEC));  // made with mode 0600
    if (!file) return file;
    ::flock(file.get(), LOCK_EX);
    struct stat status {};
    // Another process may have taken it for a left one before it was locked.
    if (::fstat(file.get(), &status) != 0 || status.st_nlink > 0) return file;
  }
}

/// Removes what killed processes left beside `target`.
void clearTemporaries(const std::filesystem::path& folder, const std::filesystem::path& target) {
  const std::string begin = target.filename().native() + ".";
  std::error_code ignored;
  for (const auto& entry : std::filesystem::directory_iterator(folder, ignored)) {
    const std::string name = entry.path().filename().native();
    if (!name.starts_with(begin) || !name.ends_with(kTemporaryEnd)) continue;
    const FileDescriptor left(::open(entry.path().c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOFOLLOW));
    struct stat status {};
    if (left && ::fstat(left.get(), &status) == 0 && S_ISREG(status.st_mode) &&
        ::flock(left.get(), LOCK_EX | LOCK_NB) == 0)
      ::unlink(entry.path().c_str());
  }
}

/// 0, or the errno value of what stands at a path at which nothing but a regular file is replaced.
int obstacleAt(const std::filesystem::path& path) {
  struct stat status {};
  if (::lstat(path.c_str(), &status) != 0 || S_ISREG(status.st_mode)) return 0;
  return S_ISDIR(status.st_mode) ? EISDIR : S_ISLNK(status.st_mode) ? ELOOP : EEXIST;
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
  const std::filesystem::path folder = path.has_parent_path() ? path.parent_path() : ".";
  if (ErrorRef error = makeFolders(folder)) return error;
  if (const int obstacle = obstacleAt(path)) return fileError("write", path, obstacle);
  clearTemporaries(folder, path);

  std::string temporary;
  const FileDescriptor file = makeTemporary(path, temporary);
  if (!file) return fileError("write", path, errno);
  int failure = writeWhole(file.get(), bytes);
  if (failure == 0 && ::rename(temporary.c_str(), path.c_str()) != 0) failure = errno;
  if (failure != 0) {
    ::unlink(temporary.c_str());
    return fileError("write", path, failure);
  }
  // The new name must outlive a crash too; file systems that cannot sync a folder have nothing better to offer.
  if (const FileDescriptor opened{::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)}) ::fsync(opened.get());
  return nullptr;
}

}  // namespace nimbo
