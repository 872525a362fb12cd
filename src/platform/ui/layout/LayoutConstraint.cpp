#include "platform/ui/layout/LayoutConstraint.h"

#include <cmath>
#include <cstdio>
#include <stdexcept>

#include "platform/ui/View.h"
#include "platform/ui/layout/LayoutEngine.h"

namespace nimbo {

namespace {

std::string textOfAnchor(const LayoutAnchor& anchor) {
  const auto item = anchor.item().lock();
  return (item ? item->layoutName() : "(gone)") + "." + std::string(nameOfLayoutAttribute(anchor.attribute()));
}

std::string textOfNumber(double number) {
  char text[32];
  std::snprintf(text, sizeof text, "%g", number);
  return text;
}

View* owningViewOf(const LayoutAnchor& anchor) {
  const auto item = anchor.item().lock();
  return item ? item->owningView() : nullptr;
}

/// The smallest view that both are in; null when there is none.
View* commonAncestor(View* a, View* b) {
  for (View* ancestor = a; ancestor; ancestor = ancestor->superview())
    if (b->isDescendantOf(*ancestor)) return ancestor;
  return nullptr;
}

}  // namespace

LayoutConstraint::LayoutConstraint(LayoutAnchor first, LayoutRelation relation, std::optional<LayoutAnchor> second,
                                   double constant)
    : _first(std::move(first)), _relation(relation), _second(std::move(second)), _constant(0) {
  setConstant(constant);
}

void LayoutConstraint::setConstant(double constant) {
  if (!std::isfinite(constant)) {
    writeLog(kLayoutLogFacility, LogLevel::error, "a constant that is not finite is refused for %@", {description()});
    return;
  }
  if (constant == _constant) return;
  _constant = constant;
  constraintDidChange();
}

void LayoutConstraint::setPriority(LayoutPriority priority) {
  if (!(priority >= 1 && priority <= kLayoutPriorityRequired))
    throw std::invalid_argument("the priority of a constraint is from 1 to 1000");
  if (priority == _priority) return;
  _priority = priority;
  constraintDidChange();
}

void LayoutConstraint::constraintDidChange() {
  if (_holder) _holder->setNeedsUpdateConstraints();
}

void LayoutConstraint::setActive(bool active) {
  if (active == isActive()) return;
  if (!active) {
    _holder->dropConstraint(*this);
    return;
  }
  View* first = owningViewOf(_first);
  View* second = _second ? owningViewOf(*_second) : first;
  View* holder = first && second ? commonAncestor(first, second) : nullptr;
  if (!holder)
    throw std::invalid_argument("the items of " + description() + " are gone or are not in one tree of views");
  static std::uint64_t lastOrder = 0;
  _order = ++lastOrder;
  holder->holdConstraint(std::static_pointer_cast<LayoutConstraint>(shared_from_this()));
}

void LayoutConstraint::activateConstraints(const std::vector<std::shared_ptr<LayoutConstraint>>& constraints) {
  for (const auto& constraint : constraints) constraint->setActive(true);
}

bool LayoutConstraint::involvesDescendantOf(const View& view) const {
  const auto isInside = [&](const LayoutAnchor& anchor) {
    const View* owner = owningViewOf(anchor);
    return owner && owner->isDescendantOf(view);
  };
  return isInside(_first) || (_second && isInside(*_second));
}

std::string LayoutConstraint::description() const {
  std::string text = _identifier.empty() ? "" : _identifier + ": ";
  text += textOfAnchor(_first);
  text += _relation == LayoutRelation::equal ? " = " : _relation == LayoutRelation::lessThanOrEqual ? " <= " : " >= ";
  if (_second) {
    text += textOfAnchor(*_second);
    if (_constant != 0) text += (_constant < 0 ? " - " : " + ") + textOfNumber(std::abs(_constant));
  } else {
    text += textOfNumber(_constant);
  }
  if (_priority < kLayoutPriorityRequired) text += " @" + textOfNumber(_priority);
  return text;
}

}  // namespace nimbo
