#pragma once

#include <unistd.h>

#include <utility>

namespace nimbo {

/// Owns a file descriptor and closes it; -1 when empty.
class FileDescriptor {
 public:
  FileDescriptor() = default;
  /// Takes over `fd`; a negative one, as system calls answer on failure, gives an empty owner.
  explicit FileDescriptor(int fd) : _fd(fd) {}
  FileDescriptor(FileDescriptor&& other) noexcept : _fd(std::exchange(other._fd, -1)) {}
  FileDescriptor& operator=(FileDescriptor&& other) noexcept {
    std::swap(_fd, other._fd);
    return *this;
  }
  ~FileDescriptor() {
    if (_fd >= 0) ::close(_fd);
  }

  int get() const { return _fd; }
  explicit operator bool() const { return _fd >= 0; }

 private:
  int _fd = -1;
};

}  // namespace nimbo
