#pragma once

#include <optional>

#include "platform/foundation/Boxed.h"

namespace nimbo {

/// What stands for bytes in the user info of a hand-off until that is opened: rows are made again and again, and hardly
/// one is tapped. Payloads are equal where the records that they would be made of are, and so are their bytes. Main
/// thread only.
class NBUserActivityPayload : public Object {
 public:
  /// Absent when they cannot be made. Made anew by each call.
  virtual std::optional<Bytes> bytes() const = 0;

  std::string_view className() const override { return "NBUserActivityPayload"; }
};

}  // namespace nimbo
