#include "platform/ui/StackView.h"

#include <algorithm>

namespace nimbo {

void StackView::addArrangedSubview(std::shared_ptr<View> view) {
  view->setUsesAutomaticConstraints(false);
  _arranged.push_back(view);
  addSubview(std::move(view));
  _takingRoom.clear();
  requireConstraintLayout();
}

void StackView::setSpacing(double spacing) {
  if (spacing == _spacing) return;
  _spacing = spacing;
  setNeedsUpdateConstraints();
}

void StackView::setBaselineRelativeArrangement(bool onBaselines) {
  _onBaselines = onBaselines;
  _takingRoom.clear();
  setNeedsUpdateConstraints();
}

bool StackView::takesRoom(View& view) { return !view.isBlank() && !view.firstBaselineView().isBlank(); }

double StackView::distanceAcross(const Gap& gap) const {
  if (!_onBaselines) return _spacing;
  return std::max(_spacing, gap.above->lastBaselineView().reachBelowBaseline() +
                                gap.below->firstBaselineView().reachAboveBaseline());
}

View* StackView::viewForFirstBaselineLayout() {
  const auto found = std::ranges::find_if(_arranged, [](const auto& view) { return takesRoom(*view); });
  return found == _arranged.end() ? nullptr : found->get();
}

View* StackView::viewForLastBaselineLayout() {
  const auto found =
      std::find_if(_arranged.rbegin(), _arranged.rend(), [](const auto& view) { return takesRoom(*view); });
  return found == _arranged.rend() ? nullptr : found->get();
}

void StackView::appendGeneratedConstraints(std::vector<const LayoutConstraint*>& constraints) {
  std::vector<bool> takingRoom;
  for (const auto& view : _arranged) takingRoom.push_back(takesRoom(*view));
  if (takingRoom != _takingRoom) {
    _takingRoom = std::move(takingRoom);
    makeConstraints();
  }
  for (const Gap& gap : _gaps) gap.constraint->setConstant(distanceAcross(gap));
  for (const auto& constraint : _generated) constraints.push_back(constraint.get());
}

void StackView::makeConstraints() {
  _generated.clear();
  _gaps.clear();
  View* above = nullptr;
  int rank = 0;
  for (std::size_t index = 0; index < _arranged.size(); ++index) {
    View& view = *_arranged[index];
    const bool isRoomy = _takingRoom[index];
    _generated.push_back(view.leadingAnchor().constraintEqualToAnchor(leadingAnchor()));
    _generated.push_back(view.trailingAnchor().constraintEqualToAnchor(trailingAnchor()));
    if (!isRoomy) {
      _generated.push_back(view.topAnchor().constraintEqualToAnchor(above ? above->bottomAnchor() : topAnchor()));
      _generated.push_back(view.heightAnchor().constraintEqualToConstant(0));
      continue;
    }
    view.firstBaselineView().setCompressionRank(++rank);
    if (above) {
      const auto gap = _onBaselines
                           ? view.firstBaselineAnchor().constraintEqualToAnchor(above->lastBaselineAnchor(), _spacing)
                           : view.topAnchor().constraintEqualToAnchor(above->bottomAnchor(), _spacing);
      _gaps.push_back({gap, above, &view});
      _generated.push_back(gap);
    } else {
      _generated.push_back(view.topAnchor().constraintEqualToAnchor(topAnchor()));
    }
    above = &view;
  }
  // Nothing to show: no height.
  _generated.push_back(above ? above->bottomAnchor().constraintEqualToAnchor(bottomAnchor())
                             : heightAnchor().constraintEqualToConstant(0));
}

}  // namespace nimbo
