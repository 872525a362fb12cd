#pragma once

#include <sys/resource.h>

#include <csignal>

namespace nimbo {

/// A disk on which no file grows beyond so many bytes, for a scope.
class FullDisk {
 public:
  explicit FullDisk(rlim_t bytes) : _handler(std::signal(SIGXFSZ, SIG_IGN)) {
    ::getrlimit(RLIMIT_FSIZE, &_before);
    const rlimit small{bytes, _before.rlim_max};
    ::setrlimit(RLIMIT_FSIZE, &small);
  }
  ~FullDisk() {
    ::setrlimit(RLIMIT_FSIZE, &_before);
    std::signal(SIGXFSZ, _handler);
  }
  FullDisk(const FullDisk&) = delete;
  FullDisk& operator=(const FullDisk&) = delete;

 private:
  rlimit _before{};
  void (*_handler)(int);
};

}  // namespace nimbo
