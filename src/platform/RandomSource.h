#pragma once

#include <cstdint>

namespace nimbo {

/// Uniform random numbers. Main thread only.
class RandomSource {
 public:
  virtual ~RandomSource() = default;
  virtual std::uint32_t next() = 0;
};

}  // namespace nimbo
