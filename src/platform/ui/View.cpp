#include "platform/ui/View.h"

#include <algorithm>
#include <cmath>
#include <stdexcept>
#include <utility>

#include "platform/ui/Environment.h"
#include "platform/ui/Painter.h"
#include "platform/ui/layout/LayoutEngine.h"

namespace nimbo {

namespace {

// Setting a length while laying out may ask for another round; a pair of views that never agree must not hang.
constexpr int kMaxLayoutRounds = 4;

/// Larger than any screen: what does not clip.
constexpr Rect kEverywhere{-1e6, -1e6, 2e6, 2e6};

}  // namespace

View::View() = default;

View::~View() {
  for (const auto& view : _subviews) view->_superview = nullptr;
  for (const auto& guide : _guides) guide->_owningView = nullptr;
  for (const auto& constraint : _constraints) constraint->_holder = nullptr;
}

void View::setFrame(const Rect& frame) {
  if (!std::isfinite(frame.x) || !std::isfinite(frame.y) || !std::isfinite(frame.width) ||
      !std::isfinite(frame.height)) {
    writeLog(kLayoutLogFacility, LogLevel::error, "a frame that is not finite is refused for %@", {layoutName()});
    return;
  }
  const Rect clean{frame.x, frame.y, std::max(frame.width, 0.0), std::max(frame.height, 0.0)};
  if (clean == _frame) return;
  const bool resized = clean.size() != _frame.size();
  _frame = clean;
  if (resized) setNeedsLayout();
  if (_usesAutomaticConstraints && !_fillsSuperview && !isLayoutRoot()) setNeedsUpdateConstraints();
}

void View::setLayoutMargins(const Insets& margins) {
  if (margins == _layoutMargins) return;
  _layoutMargins = margins;
  setNeedsLayout();
}

Rect View::layoutMarginsFrame() const {
  return {_layoutMargins.left, _layoutMargins.top,
          std::max(_frame.width - _layoutMargins.left - _layoutMargins.right, 0.0),
          std::max(_frame.height - _layoutMargins.top - _layoutMargins.bottom, 0.0)};
}

void View::addSubview(std::shared_ptr<View> view) {
  if (!view) throw std::invalid_argument("a subview is not null");
  if (isDescendantOf(*view)) throw std::invalid_argument("a view cannot be put into itself or a view inside it");
  view->removeFromSuperview();
  View& added = *view;
  added._superview = this;
  _subviews.push_back(std::move(view));
  if (added._engine && !added.isLayoutRoot()) {
    added._engine.reset();
    requireConstraintLayout();
  }
  setNeedsUpdateConstraints();
  setNeedsLayout();
}

void View::addFillingSubview(std::shared_ptr<View> view) {
  view->_fillsSuperview = true;
  addSubview(std::move(view));
}

void View::removeFromSuperview() {
  if (!_superview) return;
  const auto self = std::static_pointer_cast<View>(shared_from_this());
  bool keepsConstraints = false;
  if (!isLayoutRoot()) {
    for (View* view = _superview; view; view = view->_superview)
      for (const auto held = view->_constraints; const auto& constraint : held)
        if (constraint->involvesDescendantOf(*this)) constraint->setActive(false);
    View& root = _superview->layoutRoot();
    if (root._engine) {
      root._engine.reset();
      root.requireConstraintLayout();
      keepsConstraints = true;
    }
  }
  _superview->setNeedsLayout();
  std::erase(_superview->_subviews, self);
  _superview = nullptr;
  _fillsSuperview = false;
  if (keepsConstraints) requireConstraintLayout();
}

bool View::isDescendantOf(const View& ancestor) const {
  for (const View* view = this; view; view = view->_superview)
    if (view == &ancestor) return true;
  return false;
}

void View::setHidden(bool hidden) {
  if (hidden == _hidden) return;
  _hidden = hidden;
  setNeedsUpdateConstraints();
  if (_superview) _superview->setNeedsLayout();
}

double View::screenScale() const {
  return _superview ? _superview->screenScale() : Environment::current().screenScale();
}

bool View::isRightToLeft() const { return Environment::current().isRightToLeft(); }

View& View::layoutRoot() {
  View* view = this;
  while (!view->isLayoutRoot()) view = view->_superview;
  return *view;
}

void View::setNeedsUpdateConstraints() {
  View& root = layoutRoot();
  if (!root._engine) return;
  root._engine->setNeedsUpdate();
  root.setNeedsLayout();
  // The root may want another size.
  if (root._superview) root._superview->setNeedsLayout();
}

std::string View::layoutDump() {
  const View& root = layoutRoot();
  return root._engine ? root._engine->dump() : "no constraints in " + root.layoutName() + "\n";
}

void View::requireConstraintLayout() {
  View& root = layoutRoot();
  if (!root._engine) root._engine = std::make_unique<LayoutEngine>(root);
  setNeedsUpdateConstraints();
}

void View::setUsesAutomaticConstraints(bool uses) {
  _usesAutomaticConstraints = uses;
  setNeedsUpdateConstraints();
}

void View::addLayoutGuide(const std::shared_ptr<LayoutGuide>& guide) {
  guide->_owningView = this;
  _guides.push_back(guide);
}

void View::holdConstraint(std::shared_ptr<LayoutConstraint> constraint) {
  constraint->_holder = this;
  _constraints.push_back(std::move(constraint));
  requireConstraintLayout();
}

void View::dropConstraint(const LayoutConstraint& constraint) {
  const auto found = std::ranges::find(_constraints, &constraint, &std::shared_ptr<LayoutConstraint>::get);
  (*found)->_holder = nullptr;
  _constraints.erase(found);
  setNeedsUpdateConstraints();
}

View& View::firstBaselineView() {
  View* next = viewForFirstBaselineLayout();
  return next && next != this ? next->firstBaselineView() : *this;
}

View& View::lastBaselineView() {
  View* next = viewForLastBaselineLayout();
  return next && next != this ? next->lastBaselineView() : *this;
}

void View::setNeedsLayout() {
  _needsLayout = true;
  for (View* view = this; view; view = view->_superview) view->_subtreeNeedsLayout = true;
}

/// Everything is rounded to device pixels: another screen is another layout.
void View::setNeedsLayoutInside() {
  _needsLayout = _subtreeNeedsLayout = true;
  if (_engine) _engine->setNeedsUpdate();
  for (const auto& view : _subviews) view->setNeedsLayoutInside();
}

void View::layoutIfNeeded() {
  const double scale = screenScale();
  if (!_superview && std::exchange(_laidOutScale, scale) != scale) setNeedsLayoutInside();
  View& root = layoutRoot();
  if (&root != this && root._engine) root._engine->layOut();
  for (int round = 0; round < kMaxLayoutRounds && layoutOnce(); ++round) {
  }
}

bool View::layoutOnce() {
  if (!_subtreeNeedsLayout) return false;
  _subtreeNeedsLayout = false;
  if (_engine) _engine->layOut();
  if (_needsLayout) {
    _needsLayout = false;
    layoutSubviews();
  }
  // A copy: laying out may add and remove views.
  for (const auto views = _subviews; const auto& view : views) view->layoutOnce();
  return true;
}

void View::layoutSubviews() {
  for (const auto& view : _subviews)
    if (view->_fillsSuperview) view->setFrame(bounds());
}

Size View::systemLayoutSizeFittingSize_withHorizontalFittingPriority_verticalFittingPriority(
    Size size, LayoutPriority horizontalFittingPriority, LayoutPriority verticalFittingPriority) {
  return _engine ? _engine->fittingSize(size, horizontalFittingPriority, verticalFittingPriority) : size;
}

DrawingContext View::contextForSubviews(const DrawingContext& context) const { return context; }

void View::draw(Painter& painter) {
  const auto& environment = Environment::current();
  drawTree(painter, {environment.appearance(), screenScale(), std::nullopt});
}

void View::drawTree(Painter& painter, const DrawingContext& context) {
  drawContent(painter, context);
  const DrawingContext inner = contextForSubviews(context);
  for (const auto& view : _subviews) {
    if (view->_hidden || view->_frame.width <= 0 || view->_frame.height <= 0) continue;
    const Point origin{roundToViewScale(view->_frame.x, view.get()), roundToViewScale(view->_frame.y, view.get())};
    painter.save(origin, view->clipsToBounds() ? view->bounds() : kEverywhere);
    view->drawTree(painter, inner);
    painter.restore();
  }
}

double roundToViewScale(double length, const View* view) {
  const double scale = view ? view->screenScale() : Environment::current().screenScale();
  return std::round(length * scale) / scale;
}

}  // namespace nimbo
