#include "desktop/gtfs/net/FileReading.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/raii/FileDescriptor.h"
#include "desktop/system/AtomicFile.h"
#include "desktop/system/SmallMemory.h"

namespace nimbo {

namespace {

ErrorRef unreadable(const std::filesystem::path& path, const std::string& why) {
  return transitLineServiceError(TransitLineServiceError::unreadableFile, "Cannot read " + path.native() + ": " + why,
                                 path.native());
}

ErrorRef unreadable(const std::filesystem::path& path, int errnoValue) {
  const std::string advice = errnoValue == ENOENT   ? " Check the path, or set the feed up anew."
                             : errnoValue == EACCES ? " Allow yourself to read it."
                                                    : "";
  return unreadable(path, std::generic_category().message(errnoValue) + "." + advice);
}

Outcome<std::string> read(const std::filesystem::path& path, std::uint64_t limit, int flags) {
  // Not blocking: a path may lead to a pipe that nobody writes to.
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | flags));
  if (!file) return unreadable(path, errno);
  struct stat status {};
  if (::fstat(file.get(), &status) != 0) return unreadable(path, errno);
  if (!S_ISREG(status.st_mode)) return unreadable(path, "it is not a file. Name a file.");
  const auto tooLarge = [&] {
    return transitLineServiceError(TransitLineServiceError::tooLarge,
                                   path.native() + " is larger than the " + std::to_string(limit >> 20) +
                                       " MiB that such a file may have. Check that it is the right one.",
                                   path.native());
  };
  if ((flags & O_NOFOLLOW) && status.st_uid != ::geteuid()) return unreadable(path, "it is another user's.");
  if (static_cast<std::uint64_t>(status.st_size) > limit) return tooLarge();
  std::string bytes;
  const auto size = static_cast<std::size_t>(status.st_size) + 1;  // room to see the end without moving everything
  bytes.reserve(size);
  populate(bytes.data(), size);
  bytes.resize(size);
  std::size_t count = 0;
  for (;;) {
    if (count == bytes.size()) {  // also when the file has grown since
      if (count > limit) return tooLarge();
      bytes.resize(count + 1);
    }
    const ssize_t got = ::read(file.get(), bytes.data() + count, bytes.size() - count);
    if (got < 0 && errno == EINTR) continue;
    if (got < 0) return unreadable(path, errno);
    if (got == 0) break;
    count += static_cast<std::size_t>(got);
  }
  bytes.resize(count);
  return bytes;
}

}  // namespace

Outcome<std::string> readFile(const std::filesystem::path& path, std::uint64_t limit) { return read(path, limit, 0); }

Outcome<std::string> readOwnFile(const std::filesystem::path& path, std::uint64_t limit) {
  return read(path, limit, O_NOFOLLOW);
}

std::string fileFingerprint(const std::filesystem::path& path) {
  struct stat status {};
  if (::stat(path.c_str(), &status) != 0) return {};
  return std::to_string(status.st_size) + "@" + std::to_string(status.st_mtim.tv_sec) + "." +
         std::to_string(status.st_mtim.tv_nsec);
}

std::optional<Date> fileChangeDate(const std::filesystem::path& path) {
  struct stat status {};
  if (::stat(path.c_str(), &status) != 0) return std::nullopt;
  return Date(std::chrono::floor<Date::duration>(std::chrono::seconds(status.st_mtim.tv_sec) +
                                                 std::chrono::nanoseconds(status.st_mtim.tv_nsec)));
}

ErrorRef setFileChangeDate(const std::filesystem::path& path, Date date) {
  const auto seconds = std::chrono::floor<std::chrono::seconds>(date);
  const timespec time{static_cast<time_t>(seconds.time_since_epoch().count()),
                      static_cast<long>(std::chrono::nanoseconds(date - seconds).count())};
  const timespec times[] = {{0, UTIME_OMIT}, time};
  return ::utimensat(AT_FDCWD, path.c_str(), times, AT_SYMLINK_NOFOLLOW) == 0 ? nullptr
                                                                              : fileError("date", path, errno);
}

}  // namespace nimbo
