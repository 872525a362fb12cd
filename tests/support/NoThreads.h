#pragma once

#include <pthread.h>

#include <stdexcept>

namespace nimbo {

/// While it lives no thread can start: the stack that each would get is larger than memory can be.
class NoThreads {
 public:
  NoThreads() {
    pthread_attr_t attributes;
    pthread_getattr_default_np(&attributes);
    pthread_attr_getstacksize(&attributes, &_size);
    pthread_attr_destroy(&attributes);
    setStackSize(std::size_t(1) << 48);
  }
  ~NoThreads() { setStackSize(_size); }
  NoThreads(const NoThreads&) = delete;
  NoThreads& operator=(const NoThreads&) = delete;

 private:
  static void setStackSize(std::size_t size) {
    pthread_attr_t attributes;
    pthread_getattr_default_np(&attributes);
    pthread_attr_setstacksize(&attributes, size);
    pthread_setattr_default_np(&attributes);
    pthread_attr_destroy(&attributes);
  }

  std::size_t _size = 0;
};

}  // namespace nimbo
