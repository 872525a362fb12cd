#pragma once

#include "platform/Clock.h"

namespace nimbo {

/// The machine's wall clock.
class SystemClock final : public Clock {
 public:
  Date now() const override;
};

}  // namespace nimbo
