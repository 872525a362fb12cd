#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "desktop/raii/FileDescriptor.h"
#include "protocol/Messages.h"

namespace nimbo {

/// A picture of the widget: rows from the top, each pixel four bytes as CAIRO_FORMAT_ARGB32 has them.
struct WidgetPicture {
  protocol::Rendered layout;
  std::vector<std::uint8_t> pixels;  ///< `stride` times `height`
};

/// Memory that a host shares with its widget process, which draws into it. It has room for the largest picture that
/// the widget draws and takes what was drawn; nobody can change its size. Any thread.
class PictureMemory {
 public:
  /// Throws std::system_error when the system gives none.
  PictureMemory();

  int descriptor() const { return _memory.get(); }
  /// The bytes that such a picture takes; 0 where it is none, or larger than the memory.
  static std::size_t bytesOf(const protocol::Rendered& drawn);
  /// A copy of what the process says it drew, so many bytes from the beginning; absent when it says what no picture is.
  std::optional<WidgetPicture> take(const protocol::Rendered& drawn, std::size_t offset = 0) const;
  /// Gives back the memory that is behind the offset.
  void drop(std::size_t offset) const;

  /// Bytes: 64 million pixels.
  static constexpr std::size_t kSize = 256'000'000;
  /// Where images of incidents go, for a host that shows them: the largest one takes 64 MiB.
  static constexpr std::size_t kImageOffset = 188'000'000;

 private:
  FileDescriptor _memory;
};

}  // namespace nimbo
