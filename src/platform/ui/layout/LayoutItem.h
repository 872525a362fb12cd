#pragma once

#include <string>

#include "platform/foundation/Object.h"
#include "platform/ui/layout/LayoutAnchor.h"

namespace nimbo {

class View;

/// A rectangle that constraints are about: a view or a layout guide. Held by shared pointer; main thread only.
class LayoutItem : public Object {
 public:
  LayoutAnchor leadingAnchor() { return anchor(LayoutAttribute::leading); }
  LayoutAnchor trailingAnchor() { return anchor(LayoutAttribute::trailing); }
  LayoutAnchor topAnchor() { return anchor(LayoutAttribute::top); }
  LayoutAnchor bottomAnchor() { return anchor(LayoutAttribute::bottom); }
  LayoutAnchor centerYAnchor() { return anchor(LayoutAttribute::centerY); }
  LayoutAnchor widthAnchor() { return anchor(LayoutAttribute::width); }
  LayoutAnchor heightAnchor() { return anchor(LayoutAttribute::height); }
  /// The baseline of the first or last line of text; the bottom of an item that shows no text.
  LayoutAnchor firstBaselineAnchor() { return anchor(LayoutAttribute::firstBaseline); }
  LayoutAnchor lastBaselineAnchor() { return anchor(LayoutAttribute::lastBaseline); }

  /// The item, if it is a view.
  virtual View* asView() { return nullptr; }
  /// The view itself, or the view that a guide belongs to; null for a guide whose view is gone.
  virtual View* owningView() = 0;

  /// What logs call the item; the class name until set.
  std::string layoutName() const { return _layoutName.empty() ? std::string(className()) : _layoutName; }
  void setLayoutName(std::string name) { _layoutName = std::move(name); }

 private:
  LayoutAnchor anchor(LayoutAttribute attribute);

  std::string _layoutName;
};

}  // namespace nimbo
