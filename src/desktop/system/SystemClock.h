#pragma once

#include "platform/SystemServices.h"

namespace nimbo {

/// The machine's wall clock.
class SystemClock final : public Clock {
 public:
  Date now() const override;
};

/// Random numbers of the kernel.
class SystemRandom final : public RandomSource {
 public:
  std::uint32_t next() override;
};

}  // namespace nimbo
