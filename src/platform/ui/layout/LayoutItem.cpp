#include "platform/ui/layout/LayoutItem.h"

#include <array>
#include <cstddef>
#include <stdexcept>

#include "platform/ui/layout/LayoutConstraint.h"

namespace nimbo {

LayoutAttributeKind kindOfLayoutAttribute(LayoutAttribute attribute) {
  switch (attribute) {
    case LayoutAttribute::leading:
    case LayoutAttribute::trailing:
      return LayoutAttributeKind::horizontalPosition;
    case LayoutAttribute::width:
    case LayoutAttribute::height:
      return LayoutAttributeKind::length;
    default:
      return LayoutAttributeKind::verticalPosition;
  }
}

std::string_view nameOfLayoutAttribute(LayoutAttribute attribute) {
  static constexpr std::array<std::string_view, 9> kNames = {
      "leading", "trailing", "top", "bottom", "centerY", "width", "height", "firstBaseline", "lastBaseline"};
  return kNames.at(static_cast<std::size_t>(attribute));
}

std::shared_ptr<LayoutConstraint> LayoutAnchor::constraintEqualToAnchor(const LayoutAnchor& other,
                                                                        double constant) const {
  return constraint(LayoutRelation::equal, other, constant);
}

std::shared_ptr<LayoutConstraint> LayoutAnchor::constraintGreaterThanOrEqualToAnchor(const LayoutAnchor& other,
                                                                                     double constant) const {
  return constraint(LayoutRelation::greaterThanOrEqual, other, constant);
}

std::shared_ptr<LayoutConstraint> LayoutAnchor::constraintLessThanOrEqualToAnchor(const LayoutAnchor& other,
                                                                                  double constant) const {
  return constraint(LayoutRelation::lessThanOrEqual, other, constant);
}

std::shared_ptr<LayoutConstraint> LayoutAnchor::constraintEqualToConstant(double constant) const {
  return constraint(LayoutRelation::equal, constant);
}

std::shared_ptr<LayoutConstraint> LayoutAnchor::constraintGreaterThanOrEqualToConstant(double constant) const {
  return constraint(LayoutRelation::greaterThanOrEqual, constant);
}

std::shared_ptr<LayoutConstraint> LayoutAnchor::constraintLessThanOrEqualToConstant(double constant) const {
  return constraint(LayoutRelation::lessThanOrEqual, constant);
}

std::shared_ptr<LayoutConstraint> LayoutAnchor::constraint(LayoutRelation relation, const LayoutAnchor& other,
                                                           double constant) const {
  if (kindOfLayoutAttribute(_attribute) != kindOfLayoutAttribute(other._attribute))
    throw std::invalid_argument("a constraint compares positions of one direction, or lengths");
  return std::make_shared<LayoutConstraint>(*this, relation, other, constant);
}

std::shared_ptr<LayoutConstraint> LayoutAnchor::constraint(LayoutRelation relation, double constant) const {
  if (kindOfLayoutAttribute(_attribute) != LayoutAttributeKind::length)
    throw std::invalid_argument("only a width or a height is compared with a constant");
  return std::make_shared<LayoutConstraint>(*this, relation, std::nullopt, constant);
}

LayoutAnchor LayoutItem::anchor(LayoutAttribute attribute) {
  return {std::static_pointer_cast<LayoutItem>(shared_from_this()), attribute};
}

}  // namespace nimbo
