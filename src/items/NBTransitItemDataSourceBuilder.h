#pragma once

#include "items/NBTransitListItem.h"

namespace nimbo {

/// Makes what the widget shows of one fetch result. Lives for one rebuild; main thread only.
class NBTransitItemDataSourceBuilder : public Object {
 public:
  /// Built on the first call, the same object on every later one. Never null.
  virtual const NBTransitListItemRef& listItem() = 0;
};

}  // namespace nimbo
