#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>

#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

/// Memory into which the widget process draws one picture, and which the window then shows as it stands, without a
/// copy. The process cannot make it smaller once it is mapped.
class SharedPicture {
 public:
  /// How the pixels lie: rows from the top, each pixel four bytes as CAIRO_FORMAT_ARGB32 has them.
  struct Layout {
    int width = 0;     ///< pixels
    int height = 0;    ///< pixels
    int stride = 0;    ///< bytes from a row to the next
    double scale = 1;  ///< pixels for each point
  };

  /// Throws std::system_error when the system gives no memory.
  SharedPicture();
  ~SharedPicture();
  SharedPicture(const SharedPicture&) = delete;
  SharedPicture& operator=(const SharedPicture&) = delete;

  /// The file that a process of the same user opens to draw, until the picture is mapped.
  std::string path() const;

  /// Maps what the process says it drew. False, and the picture stays empty, when that is no picture or larger than
  /// what is there.
  bool map(const Layout& layout);

  const Layout& layout() const { return _layout; }
  /// Empty until mapped.
  std::span<const std::uint8_t> pixels() const { return _pixels; }

 private:
  FileDescriptor _memory;
  Layout _layout;
  std::span<const std::uint8_t> _pixels;
};

}  // namespace nimbo
