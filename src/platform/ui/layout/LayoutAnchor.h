#pragma once

#include <memory>

#include "platform/ui/layout/LayoutAttribute.h"
#include "platform/ui/layout/LayoutRelation.h"

namespace nimbo {

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

}  // namespace nimbo
