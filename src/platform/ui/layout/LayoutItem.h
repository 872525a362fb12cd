#pragma once

#include <memory>
#include <string>
#include <string_view>

#include "platform/foundation/Geometry.h"
#include "platform/foundation/Object.h"

namespace nimbo {

/// What of an item a constraint is about. Leading is left where texts run from left to right, and right elsewhere.
enum class LayoutAttribute {
  leading,
  trailing,
  top,
  bottom,
  centerY,
  width,
  height,
  firstBaseline,
  lastBaseline,
};

/// Attributes of different kinds cannot be compared.
enum class LayoutAttributeKind { horizontalPosition, verticalPosition, length };

LayoutAttributeKind kindOfLayoutAttribute(LayoutAttribute attribute);
/// The enumerator's name.
std::string_view nameOfLayoutAttribute(LayoutAttribute attribute);

enum class LayoutRelation { lessThanOrEqual = -1, equal = 0, greaterThanOrEqual = 1 };

class LayoutConstraint;
class LayoutItem;

/// An attribute of an item, to make constraints from. They are required and not active until made otherwise. Holds its
/// item weakly.
class LayoutAnchor {
 public:
  LayoutAnchor(std::weak_ptr<LayoutItem> item, LayoutAttribute attribute)
      : _item(std::move(item)), _attribute(attribute) {}

  /// This anchor is equal to the other plus a constant in points, not less or not greater. Horizontal constants grow
  /// from leading to trailing. Throws std::invalid_argument for anchors of different kinds.
  std::shared_ptr<LayoutConstraint> constraintEqualToAnchor(const LayoutAnchor& other, double constant = 0) const;
  std::shared_ptr<LayoutConstraint> constraintGreaterThanOrEqualToAnchor(const LayoutAnchor& other,
                                                                         double constant = 0) const;
  std::shared_ptr<LayoutConstraint> constraintLessThanOrEqualToAnchor(const LayoutAnchor& other,
                                                                      double constant = 0) const;
  /// This width or height is a number of points. Throws std::invalid_argument for other anchors.
  std::shared_ptr<LayoutConstraint> constraintEqualToConstant(double constant) const;
  std::shared_ptr<LayoutConstraint> constraintGreaterThanOrEqualToConstant(double constant) const;
  std::shared_ptr<LayoutConstraint> constraintLessThanOrEqualToConstant(double constant) const;

  const std::weak_ptr<LayoutItem>& item() const { return _item; }
  LayoutAttribute attribute() const { return _attribute; }

 private:
  std::shared_ptr<LayoutConstraint> constraint(LayoutRelation relation, const LayoutAnchor& other,
                                               double constant) const;
  std::shared_ptr<LayoutConstraint> constraint(LayoutRelation relation, double constant) const;

  std::weak_ptr<LayoutItem> _item;
  LayoutAttribute _attribute;
};

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
