#include "platform/ui/layout/LayoutAnchor.h"

#include <stdexcept>

#include "platform/ui/layout/LayoutConstraint.h"

namespace nimbo {

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

}  // namespace nimbo
