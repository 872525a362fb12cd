#include "process/SharedSurface.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

ErrorRef writeSharedSurface(const Picture& picture, const std::filesystem::path& path) {
  const auto failure = [&] {
    return Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), kDrawingErrorNotDrawn,
                                              "cannot draw into " + path.native() + ": " + std::strerror(errno));
  };
  const FileDescriptor file(::open(path.c_str(), O_RDWR | O_CLOEXEC));
  const auto pixels = picture.pixels();
  if (!file || ::ftruncate(file.get(), static_cast<off_t>(pixels.size())) != 0) return failure();
  for (std::size_t written = 0; written < pixels.size();) {
    const ssize_t count =
        ::pwrite(file.get(), pixels.data() + written, pixels.size() - written, static_cast<off_t>(written));
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return failure();
    written += static_cast<std::size_t>(count);
  }
  return nullptr;
}

}  // namespace nimbo
