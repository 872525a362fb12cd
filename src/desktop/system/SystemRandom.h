#pragma once

#include "platform/RandomSource.h"

namespace nimbo {

/// Random numbers of the kernel.
class SystemRandom final : public RandomSource {
 public:
  std::uint32_t next() override;
};

}  // namespace nimbo
