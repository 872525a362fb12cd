#pragma once

#include <pthread.h>

#include <stdexcept>

namespace nimbo {

/// While it lives no thread can start: the stack that each would get is larger than memory can be.
class NoThreads {
 public:
  NoThreads() {
    pthread_getattr_default_np(&_before);
    pthread_attr_t without = _before;
    pthread_attr_setstacksize(&without, std::size_t(1) << 48);
    pthread_setattr_default_np(&without);
  }
  ~NoThreads() { pthread_setattr_default_np(&_before); }
  NoThreads(const NoThreads&) = delete;
  NoThreads& operator=(const NoThreads&) = delete;

 private:
  pthread_attr_t _before;
};

}  // namespace nimbo
