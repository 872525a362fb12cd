#pragma once

#include "platform/foundation/Geometry.h"
#include "platform/ui/layout/LayoutItem.h"

namespace nimbo {

/// A rectangle of a view that constraints can be about and that shows nothing. Add it with `View::addLayoutGuide`.
class LayoutGuide final : public LayoutItem {
 public:
  View* owningView() override { return _owningView; }
  /// In the owning view's coordinates, in points, as of the last layout.
  const Rect& layoutFrame() const { return _layoutFrame; }

  std::string_view className() const override { return "LayoutGuide"; }

 private:
  friend class View;
  friend class LayoutEngine;
  View* _owningView = nullptr;  // clears this when it goes
  Rect _layoutFrame;
};

}  // namespace nimbo
