#include "host/PictureMemory.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>

namespace nimbo {

namespace {

/// What pictures can have, by Cairo's coordinates.
constexpr int kLargestSide = 32767;
constexpr double kLargestScale = 16;

}  // namespace

PictureMemory::PictureMemory() : _memory(memfd_create("nimbo-widget", MFD_CLOEXEC | MFD_ALLOW_SEALING)) {
  // A file that shrinks would end a host that has it mapped.
  if (!_memory || ftruncate(_memory.get(), static_cast<off_t>(kSize)) != 0 ||
      fcntl(_memory.get(), F_ADD_SEALS, F_SEAL_SHRINK | F_SEAL_GROW | F_SEAL_SEAL) != 0)
    throw std::system_error(errno, std::generic_category(), "no memory for the widget's pictures");
}

std::size_t PictureMemory::bytesOf(const protocol::Rendered& drawn) {
  const auto isSide = [](std::int32_t pixels) { return pixels > 0 && pixels <= kLargestSide; };
  if (!isSide(drawn.width) || !isSide(drawn.height) || drawn.stride < drawn.width * 4 || drawn.stride % 4 != 0 ||
      !(drawn.scale > 0 && drawn.scale <= kLargestScale))
    return 0;
  const std::size_t size = static_cast<std::size_t>(drawn.stride) * static_cast<std::size_t>(drawn.height);
  return size <= kSize ? size : 0;
}

std::optional<WidgetPicture> PictureMemory::take(const protocol::Rendered& drawn, std::size_t offset) const {
  const std::size_t size = bytesOf(drawn);
  if (size == 0 || offset > kSize - size) return std::nullopt;
  WidgetPicture picture{drawn, std::vector<std::uint8_t>(size)};
  for (std::size_t taken = 0; taken < size;) {
    const ssize_t count =
        pread(_memory.get(), picture.pixels.data() + taken, size - taken, static_cast<off_t>(offset + taken));
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return std::nullopt;
    taken += static_cast<std::size_t>(count);
  }
  return picture;
}

void PictureMemory::drop(std::size_t offset) const {
  // A system that cannot keeps it.
  (void)fallocate(_memory.get(), FALLOC_FL_PUNCH_HOLE | FALLOC_FL_KEEP_SIZE, static_cast<off_t>(offset),
                  static_cast<off_t>(kSize - offset));
}

}  // namespace nimbo
