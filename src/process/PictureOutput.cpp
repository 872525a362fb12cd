#include "process/PictureOutput.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <string>

namespace nimbo {

namespace {

ErrorRef notDrawn(std::string reason) {
  return Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), kDrawingErrorNotDrawn, std::move(reason));
}

}  // namespace

ErrorRef writePicture(const Picture& picture, int memory, std::uint64_t offset, std::uint64_t capacity) {
  const auto failure = [] { return notDrawn(std::string("cannot draw into the memory: ") + std::strerror(errno)); };
  const auto pixels = picture.pixels();
  struct stat status {};
  if (::fstat(memory, &status) != 0) return failure();
  const auto size = static_cast<std::uint64_t>(status.st_size);
  const std::uint64_t room = std::min(size - std::min(offset, size), capacity);
  if (room < pixels.size())
    return notDrawn("the picture takes " + std::to_string(pixels.size()) + " bytes, more than the " +
                    std::to_string(room) + " of the host's memory");
  for (std::size_t written = 0; written < pixels.size();) {
    const ssize_t count =
        ::pwrite(memory, pixels.data() + written, pixels.size() - written, static_cast<off_t>(offset + written));
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return failure();
    written += static_cast<std::size_t>(count);
  }
  return nullptr;
}

}  // namespace nimbo
