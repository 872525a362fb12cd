#pragma once

#include <string>

#include "host/window/OpenRequest.h"

namespace nimbo {

/// Goes to other places on behalf of a page.
class Navigator {
 public:
  virtual ~Navigator() = default;
  /// Shows a place: in front of the pages there are, or by going back to it.
  virtual void open(const OpenRequest& request) = 0;
  /// Tells the user of something that went wrong, in words that he can act on.
  virtual void tell(const std::string& message) = 0;
};

}  // namespace nimbo
