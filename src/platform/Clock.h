#pragma once

#include "platform/foundation/Date.h"

namespace nimbo {

/// The wall clock. Any thread.
class Clock {
 public:
  virtual ~Clock() = default;
  virtual Date now() const = 0;
};

/// The present moment by the clock of the platform in force.
Date currentDate();

/// Seconds from now to `date`: positive when it lies in the future.
TimeInterval intervalFromNow(Date date);

}  // namespace nimbo
