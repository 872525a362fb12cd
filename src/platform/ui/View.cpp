#include "platform/ui/View.h"

#include <algorithm>
#include <cmath>
#include <stdexcept>

#include "platform/foundation/Log.h"
#include "platform/ui/LayoutLog.h"

namespace nimbo {

namespace {

// Setting a length while laying out may ask for another round; a pair of views that never agree must not hang.
constexpr int kMaxLayoutRounds = 4;

}  // namespace

View::~View() {
  for (const auto& view : _subviews) view->_superview = nullptr;
}

void View::setFrame(const Rect& frame) {
  if (!std::isfinite(frame.x) || !std::isfinite(frame.y) || !std::isfinite(frame.width) ||
      !std::isfinite(frame.height)) {
    writeLog(kLayoutLogFacility, LogLevel::error, "%@ was given a frame that is not finite; it keeps the one it had",
             {description()});
    return;
  }
  const Rect clean{frame.x, frame.y, std::max(frame.width, 0.0), std::max(frame.height, 0.0)};
  if (clean == _frame) return;
  const bool resized = clean.size() != _frame.size();
  _frame = clean;
  if (resized) setNeedsLayout();
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
  view->_superview = this;
  _subviews.push_back(std::move(view));
  setNeedsLayout();
}

void View::removeFromSuperview() {
  if (!_superview) return;
  const auto self = std::static_pointer_cast<View>(shared_from_this());
  std::erase(_superview->_subviews, self);
  _superview->setNeedsLayout();
  _superview = nullptr;
}

bool View::isDescendantOf(const View& ancestor) const {
  for (const View* view = this; view; view = view->_superview)
    if (view == &ancestor) return true;
  return false;
}

void View::setHidden(bool hidden) {
  if (hidden == _hidden) return;
  _hidden = hidden;
  if (_superview) _superview->setNeedsLayout();
}

void View::setNeedsLayout() {
  _needsLayout = true;
  for (View* view = this; view; view = view->_superview) view->_subtreeNeedsLayout = true;
}

void View::layoutIfNeeded() {
  for (int round = 0; round < kMaxLayoutRounds && layoutOnce(); ++round) {
  }
}

bool View::layoutOnce() {
  if (!_subtreeNeedsLayout) return false;
  _subtreeNeedsLayout = false;
  if (_needsLayout) {
    _needsLayout = false;
    layoutSubviews();
  }
  // A copy: laying out may add and remove views.
  for (const auto views = _subviews; const auto& view : views) view->layoutOnce();
  return true;
}

}  // namespace nimbo
