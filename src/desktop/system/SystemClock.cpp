#include "desktop/system/SystemClock.h"

#include <sys/random.h>

#include <cerrno>
#include <system_error>

namespace nimbo {

Date SystemClock::now() const {
  return std::chrono::time_point_cast<std::chrono::microseconds>(std::chrono::system_clock::now());
}

std::uint32_t SystemRandom::next() {
  std::uint32_t number = 0;
  while (::getrandom(&number, sizeof number, 0) != sizeof number)
    if (errno != EINTR) throw std::system_error(errno, std::generic_category(), "getrandom");
  return number;
}

}  // namespace nimbo
