#pragma once

#include <functional>

#include "platform/foundation/Error.h"

namespace nimbo {

/// What a tapped row opens. Immutable, made with its row and opened on the main thread.
class NBOpenable : public Object {
 public:
  /// `error` is null after a success, and where the one who opens knows no reason.
  using Completion = std::function<void(bool opened, const ErrorRef& error)>;

  /// Opens this from `context`, the view controller whose row was tapped. Calls `completion`, when there is one, once:
  /// at once for a failure found here, else when and where the opener reports.
  virtual void openInContext_completionHandler(Object* context, Completion completion) const = 0;
};

using NBOpenableRef = std::shared_ptr<const NBOpenable>;

}  // namespace nimbo
