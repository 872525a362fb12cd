#include "desktop/system/SystemClock.h"

namespace nimbo {

Date SystemClock::now() const {
  return std::chrono::time_point_cast<std::chrono::microseconds>(std::chrono::system_clock::now());
}

}  // namespace nimbo
