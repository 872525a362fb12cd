#include "platform/foundation/Hash.h"

#include <cmath>

namespace nimbo {

std::uint64_t hashOfDouble(double value) {
  constexpr double kTwoTo64 = 18446744073709551616.0;
  const double magnitude = std::fabs(value);
  if (!std::isfinite(magnitude)) return 0;
  const double integer = std::floor(magnitude + 0.5);
  const double fraction = (magnitude - integer) * kTwoTo64;
  // |fraction| is at most half of 2^64, so that only the sign needs a guard.
  const auto fractionPart = fraction > 0 ? static_cast<std::uint64_t>(fraction) : 0;
  return static_cast<std::uint64_t>(std::fmod(integer, kTwoTo64)) * kHashMultiplier + fractionPart;
}

}  // namespace nimbo
