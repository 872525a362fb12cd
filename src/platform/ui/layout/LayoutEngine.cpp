#include "platform/ui/layout/LayoutEngine.h"

#include <algorithm>
#include <cmath>

#include "platform/ui/View.h"

namespace nimbo {

namespace {

// Heights of texts follow from widths, and cut texts from heights: a few rounds settle what can settle.
constexpr int kMaxSettlingRounds = 4;

// The root's own size yields to required constraints inside it: what does not fit is cut off, not torn apart.
constexpr LayoutPriority kRootSizePriority = 999.9f;

// Content yields to a constraint of the same priority; of several contents those of higher rank yield first, and a
// first line of text yields after all the others.
constexpr double kFirstLineYield = 0.1;
constexpr double kContentYield = 0.5;
constexpr double kRankYield = 0.001;

// Smaller differences come from rounding.
constexpr double kSameLength = 1e-6;

bool isSameLength(double a, double b) { return std::abs(a - b) < kSameLength; }

}  // namespace

Size LayoutEngine::fittingSize(Size wanted, LayoutPriority horizontalPriority, LayoutPriority verticalPriority) {
  const Target target{wanted, std::min(horizontalPriority, kRootSizePriority),
                      std::min(verticalPriority, kRootSizePriority)};
  if (_needsUpdate || !_fitting || _fitting->first != target) {
    solveFor(target);
    _fitting = {target, solvedRootSize()};
  }
  return _fitting->second;
}

void LayoutEngine::layOut() {
  const Size size = _root.frame().size();
  const Size solved = _solved ? solvedRootSize() : Size{};
  if (_needsUpdate || !_solved || !isSameLength(solved.width, size.width) || !isSameLength(solved.height, size.height))
    solveFor({size, kRootSizePriority, kRootSizePriority});
  if (_applied != size) applyFrames();
  _applied = size;
}

void LayoutEngine::solveFor(const Target& target) {
  if (!_needsUpdate && _solved == target) return;
  if (!_rootWidth) {
    _rootWidth = _root.widthAnchor().constraintEqualToConstant(0);
    _rootHeight = _root.heightAnchor().constraintEqualToConstant(0);
  }
  _rootWidth->setConstant(target.size.width);
  _rootWidth->setPriority(target.horizontal);
  _rootHeight->setConstant(target.size.height);
  _rootHeight->setPriority(target.vertical);
  if (_needsUpdate) _fitting.reset();
  _needsUpdate = false;
  _solved = target;
  _applied.reset();
  settle();
}

void LayoutEngine::settle() {
  _views.clear();
  collectViews(_root);
  for (View* view : _views) view->forgetAdaptedSize();
  for (int round = 0; round < kMaxSettlingRounds; ++round) {
    collectConstraints();
    ConstraintInstaller::Forms forms;
    // By index: a form can need the automatic constraints of a view that nothing was about before.
    for (std::size_t index = 0; index < _current.size(); ++index)
      if (const auto form = formOf(*_current[index])) forms.emplace_back(_current[index], *form);
    _installer.update(forms, _root.layoutName());
    if (!adaptContents()) break;
  }
}

void LayoutEngine::collectViews(View& view) {
  _views.push_back(&view);
  for (const auto& subview : view.subviews())
    if (!subview->isLayoutRoot()) collectViews(*subview);
}

bool LayoutEngine::adaptContents() {
  bool changed = false;
  for (View* view : _views) {
    const auto variables = _variables.find(view);
    if (view->isHidden() || variables == _variables.end()) continue;
    const auto& [x, y, width, height] = variables->second;
    changed |= view->adaptToSize({_installer.value(width), _installer.value(height)});
  }
  return changed;
}

void LayoutEngine::collectConstraints() {
  _current = {_rootWidth.get(), _rootHeight.get()};
  for (View* view : _views) {
    for (const auto& constraint : view->constraints()) _current.push_back(constraint.get());
    view->appendGeneratedConstraints(_current);
    if (view->usesAutomaticConstraints()) {
      if (_variables.contains(view)) collectAutomaticConstraints(*view);
    } else if (!view->isHidden()) {
      collectContentConstraints(*view);
    }
  }
}

/// A frame set by hand, as constraints for what depends on it.
void LayoutEngine::collectAutomaticConstraints(View& view) {
  if (&view == &_root) return;
  View& around = *view.superview();
  auto& constraints = _automatic[&view];
  if (!constraints[0])
    constraints = {view.leadingAnchor().constraintEqualToAnchor(around.leadingAnchor()),
                   view.topAnchor().constraintEqualToAnchor(around.topAnchor()),
                   view.widthAnchor().constraintEqualToConstant(0), view.heightAnchor().constraintEqualToConstant(0)};
  const Rect& frame = view.frame();
  constraints[0]->setConstant(_root.isRightToLeft() ? around.bounds().width - frame.maxX() : frame.x);
  constraints[1]->setConstant(frame.y);
  constraints[2]->setConstant(frame.width);
  constraints[3]->setConstant(frame.height);
  for (const auto& constraint : constraints) _current.push_back(constraint.get());
}

void LayoutEngine::collectContentConstraints(View& view) {
  const ContentSize size = view.contentSize();
  if (!size.width && !size.height) return;
  const double yield = kRankYield * view._compressionRank;
  const auto minimum = static_cast<LayoutPriority>(kLayoutPriorityCompressionResistance - kContentYield - yield);
  const auto firstLine = static_cast<LayoutPriority>(kLayoutPriorityCompressionResistance - kFirstLineYield - yield);
  ContentConstraints& content = _contents[&view];
  const auto ask = [&](LayoutConstraintRef& constraint, LayoutAttribute attribute, LayoutRelation relation,
                       double length, LayoutPriority priority) {
    if (!constraint) {
      const LayoutAnchor anchor = attribute == LayoutAttribute::width ? view.widthAnchor() : view.heightAnchor();
      constraint = std::make_shared<LayoutConstraint>(anchor, relation, std::nullopt, length);
    }
    constraint->setConstant(length);
    constraint->setPriority(priority);
    _current.push_back(constraint.get());
  };
  using enum LayoutRelation;
  if (size.width) {
    ask(content.minimumWidth, LayoutAttribute::width, greaterThanOrEqual, *size.width, minimum);
    ask(content.maximumWidth, LayoutAttribute::width, lessThanOrEqual, *size.width, kLayoutPriorityHugging);
  }
  if (size.height) {
    ask(content.minimumHeight, LayoutAttribute::height, greaterThanOrEqual, *size.height, minimum);
    ask(content.maximumHeight, LayoutAttribute::height, lessThanOrEqual, *size.height, kLayoutPriorityHugging);
  }
  if (size.firstLineHeight > 0)
    ask(content.firstLine, LayoutAttribute::height, greaterThanOrEqual, size.firstLineHeight, firstLine);
}

std::optional<LayoutEngine::Form> LayoutEngine::formOf(const LayoutConstraint& constraint) {
  Form form;
  form.constant = -constraint.constant();
  form.relation = constraint.relation();
  form.priority = constraint.priority();
  if (!addAnchor(form, constraint.firstAnchor(), 1)) return std::nullopt;
  if (constraint.secondAnchor() && !addAnchor(form, *constraint.secondAnchor(), -1)) return std::nullopt;
  return form;
}

bool LayoutEngine::addAnchor(Form& form, const LayoutAnchor& anchor, double sign) {
  const auto held = anchor.item().lock();
  if (!held) return false;
  LayoutItem* item = held.get();
  std::optional<double> fromTop, fromBottom;
  if (View* view = item->asView()) {
    if (anchor.attribute() == LayoutAttribute::firstBaseline) {
      View& text = view->firstBaselineView();
      fromTop = text.firstBaselineFromTop();
      item = &text;
    } else if (anchor.attribute() == LayoutAttribute::lastBaseline) {
      View& text = view->lastBaselineView();
      fromBottom = text.lastBaselineFromBottom();
      item = &text;
    }
  }
  const Variables variables = variablesOf(*item);
  const auto addPosition = [&](const std::optional<Variable>& origin) {
    if (origin) form.add(*origin, sign);
  };
  switch (anchor.attribute()) {
    case LayoutAttribute::leading:
      addPosition(variables.x);
      break;
    case LayoutAttribute::trailing:
      addPosition(variables.x);
      form.add(variables.width, sign);
      break;
    case LayoutAttribute::top:
      addPosition(variables.y);
      break;
    case LayoutAttribute::centerY:
      addPosition(variables.y);
      form.add(variables.height, sign / 2);
      break;
    case LayoutAttribute::width:
      form.add(variables.width, sign);
      break;
    case LayoutAttribute::height:
      form.add(variables.height, sign);
      break;
    case LayoutAttribute::bottom:
    case LayoutAttribute::firstBaseline:
    case LayoutAttribute::lastBaseline:
      addPosition(variables.y);
      if (!fromTop) form.add(variables.height, sign);
      form.constant += sign * (fromTop.value_or(0) - fromBottom.value_or(0));
      break;
  }
  return true;
}

/// Makes them on first use, with those of the views around; a view that fills another has that one's.
LayoutEngine::Variables LayoutEngine::variablesOf(LayoutItem& item) {
  View* view = item.asView();
  if (view && view != &_root && view->_fillsSuperview) return variablesOf(*view->superview());
  if (const auto found = _variables.find(&item); found != _variables.end()) return found->second;
  if (view != &_root) variablesOf(view ? *view->superview() : *item.owningView());
  Variables variables;
  if (view != &_root) {
    variables.x = _installer.addVariable(LayoutSolver::Sign::any);
    variables.y = _installer.addVariable(LayoutSolver::Sign::any);
  }
  variables.width = _installer.addVariable(LayoutSolver::Sign::notNegative);
  variables.height = _installer.addVariable(LayoutSolver::Sign::notNegative);
  _variables.emplace(&item, variables);
  if (view && view->usesAutomaticConstraints()) collectAutomaticConstraints(*view);
  return variables;
}

Size LayoutEngine::solvedRootSize() const {
  const auto variables = _variables.find(&_root);
  if (variables == _variables.end()) return {};
  return {_installer.value(variables->second.width), _installer.value(variables->second.height)};
}

void LayoutEngine::applyFrames() {
  const Screen screen{_root.screenScale(), _root.isRightToLeft()};
  for (const auto& [item, variables] : _variables) {
    if (View* view = item->asView()) {
      if (view != &_root && !view->usesAutomaticConstraints())
        view->setFrame(frameOf(variables, *view->superview(), screen));
    } else {
      static_cast<LayoutGuide*>(item)->_layoutFrame = frameOf(variables, *item->owningView(), screen);
    }
  }
}

/// From the root's leading top corner, with the edges on device pixels.
Rect LayoutEngine::solvedRect(const Variables& variables, const Screen& screen) const {
  const auto rounded = [&](double length) { return std::round(length * screen.scale) / screen.scale; };
  const double x = variables.x ? _installer.value(*variables.x) : 0;
  const double y = variables.y ? _installer.value(*variables.y) : 0;
  const double left = rounded(x), top = rounded(y);
  return {left, top, rounded(x + _installer.value(variables.width)) - left,
          rounded(y + _installer.value(variables.height)) - top};
}

/// In the coordinates of the view around it; the root is as large as it really is.
Rect LayoutEngine::frameOf(const Variables& variables, View& around, const Screen& screen) {
  const View* measured = &around;
  while (measured != &_root && measured->_fillsSuperview) measured = measured->superview();
  const Rect outer = measured == &_root ? _root.bounds() : solvedRect(variablesOf(around), screen);
  Rect frame = solvedRect(variables, screen);
  frame.x -= outer.x;
  frame.y -= outer.y;
  if (screen.rightToLeft) frame.x = outer.width - frame.maxX();
  return frame;
}

std::string LayoutEngine::dump() const {
  return _installer.dump([this](Variable variable) -> std::string {
    for (const auto& [item, variables] : _variables) {
      const std::string name = item->layoutName();
      if (variables.x == variable) return name + ".x";
      if (variables.y == variable) return name + ".y";
      if (variables.width == variable) return name + ".width";
      if (variables.height == variable) return name + ".height";
    }
    return "?";
  });
}

}  // namespace nimbo
