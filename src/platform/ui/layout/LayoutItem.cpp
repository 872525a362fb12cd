#include "platform/ui/layout/LayoutItem.h"

namespace nimbo {

LayoutAnchor LayoutItem::anchor(LayoutAttribute attribute) {
  return {std::static_pointer_cast<LayoutItem>(shared_from_this()), attribute};
}

}  // namespace nimbo
