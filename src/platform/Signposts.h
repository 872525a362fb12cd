#pragma once

#include <string_view>

#include "platform/foundation/Log.h"

namespace nimbo {

/// The performance log: named point events.
class Signposts {
 public:
  virtual ~Signposts() = default;
  /// Any thread.
  virtual void event(const LogFacility& facility, std::string_view name, std::string_view message) = 0;
};

}  // namespace nimbo
