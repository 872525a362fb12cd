#include "host/window/SharedPicture.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>
#include <utility>

namespace nimbo {

namespace {

/// More than any screen shows.
constexpr int kLargestSide = 16384;
constexpr double kLargestScale = 16;

}  // namespace

SharedPicture::SharedPicture() : _memory(memfd_create("nimbo-widget", MFD_CLOEXEC | MFD_ALLOW_SEALING)) {
  if (!_memory) throw std::system_error(errno, std::generic_category(), "no memory for the widget's picture");
}

SharedPicture::~SharedPicture() {
  if (!_pixels.empty()) munmap(const_cast<std::uint8_t*>(_pixels.data()), _pixels.size());
}

std::string SharedPicture::path() const {
  return "/proc/" + std::to_string(getpid()) + "/fd/" + std::to_string(_memory.get());
}

bool SharedPicture::map(const Layout& layout) {
  const FileDescriptor memory = std::exchange(_memory, FileDescriptor());
  const auto isSide = [](int pixels) { return pixels > 0 && pixels <= kLargestSide; };
  if (!isSide(layout.width) || !isSide(layout.height) || layout.stride < layout.width * 4 ||
      layout.stride > kLargestSide * 8 || !(layout.scale > 0 && layout.scale <= kLargestScale))
    return false;
  const std::size_t size = static_cast<std::size_t>(layout.stride) * static_cast<std::size_t>(layout.height);
  struct stat status {};
  // Sealed before its size is read: a file that shrinks later would end this process on the next look at it.
  if (fcntl(memory.get(), F_ADD_SEALS, F_SEAL_SHRINK | F_SEAL_GROW | F_SEAL_SEAL) != 0 ||
      fstat(memory.get(), &status) != 0 || static_cast<std::size_t>(status.st_size) < size)
    return false;
  void* pixels = mmap(nullptr, size, PROT_READ, MAP_SHARED, memory.get(), 0);
  if (pixels == MAP_FAILED) return false;
  _pixels = {static_cast<const std::uint8_t*>(pixels), size};
  _layout = layout;
  return true;
}

}  // namespace nimbo
