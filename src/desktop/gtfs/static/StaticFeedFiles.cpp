#include "desktop/gtfs/static/StaticFeedFiles.h"

#include <fcntl.h>

#include <array>
#include <cerrno>
#include <system_error>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

Outcome<bool> FolderFeedFiles::read(std::string_view name, std::uint64_t limit, const Sink& sink) {
  const std::filesystem::path path = _folder / name;
  const auto unreadable = [&] {
    return transitLineServiceError(
        TransitLineServiceError::unreadableFile,
        "Cannot read " + path.native() + ": " + std::generic_category().message(errno) + ". Check the static feed.",
        path.native());
  };
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
  if (!file) {
    if (errno == ENOENT) return false;
    return unreadable();
  }
  std::array<char, 64 * 1024> buffer;
  for (std::uint64_t total = 0;;) {
    const ssize_t count = ::read(file.get(), buffer.data(), buffer.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) return unreadable();
    if (count == 0) return true;
    total += static_cast<std::uint64_t>(count);
    if (total > limit)
      return transitLineServiceError(TransitLineServiceError::tooLarge,
                                     path.native() + " is larger than the " + std::to_string(limit >> 20) +
                                         " MiB that such a file may have. Check the static feed.",
                                     path.native());
    if (!sink({buffer.data(), static_cast<std::size_t>(count)})) return true;
  }
}

}  // namespace nimbo
