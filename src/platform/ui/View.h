#pragma once

#include <memory>
#include <vector>

#include "platform/foundation/Object.h"
#include "platform/ui/Geometry.h"

namespace nimbo {

/// A rectangle on the screen with other views in it. Held by shared pointer; main thread only.
class View : public Object {
 public:
  View() = default;
  ~View() override;

  /// Points, in the superview's coordinates.
  const Rect& frame() const { return _frame; }
  /// Numbers that are not finite are refused and logged; negative sizes become 0.
  void setFrame(const Rect& frame);
  /// The frame's size at the origin.
  Rect bounds() const { return {0, 0, _frame.width, _frame.height}; }

  /// Distances from the edges that `layoutMarginsFrame` keeps, in points. None until set.
  const Insets& layoutMargins() const { return _layoutMargins; }
  void setLayoutMargins(const Insets& margins);
  /// The bounds inside the layout margins, never of negative size.
  Rect layoutMarginsFrame() const;

  /// Puts a view on top of the others, out of the superview it had. Throws std::invalid_argument for null, for this
  /// view and for one that this view is in.
  void addSubview(std::shared_ptr<View> view);
  void removeFromSuperview();
  /// Null for the root. Valid as long as this view stays in it.
  View* superview() const { return _superview; }
  /// From back to front.
  const std::vector<std::shared_ptr<View>>& subviews() const { return _subviews; }
  /// Whether this view is `ancestor` or inside it.
  bool isDescendantOf(const View& ancestor) const;

  bool isHidden() const { return _hidden; }
  virtual void setHidden(bool hidden);

  /// Asks for `layoutSubviews` at the next `layoutIfNeeded`.
  void setNeedsLayout();
  /// Lays out this view and all inside it that asked; stops after a fixed number of rounds.
  void layoutIfNeeded();
  /// Sets the subviews' frames. Overrides call the base.
  virtual void layoutSubviews() {}

  std::string_view className() const override { return "View"; }

 private:
  bool layoutOnce();

  Rect _frame;
  Insets _layoutMargins;
  View* _superview = nullptr;
  std::vector<std::shared_ptr<View>> _subviews;
  bool _hidden = false;
  bool _needsLayout = true;
  bool _subtreeNeedsLayout = true;  // this view or one inside it needs layout
};

}  // namespace nimbo
