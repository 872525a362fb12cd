#include "ui/VisualEffectWrappingView.h"

namespace nimbo {

void VisualEffectWrappingView::setWrappedView(std::shared_ptr<View> view) {
  if (view == _wrappedView) return;
  if (_wrappedView && _wrappedView->superview() == contentView().get()) _wrappedView->removeFromSuperview();
  _wrappedView = std::move(view);
  if (!_wrappedView) return;
  _wrappedView->setUsesAutomaticConstraints(false);
  contentView()->addSubview(_wrappedView);
  LayoutConstraint::activateConstraints({_wrappedView->leadingAnchor().constraintEqualToAnchor(leadingAnchor()),
                                         _wrappedView->trailingAnchor().constraintEqualToAnchor(trailingAnchor()),
                                         _wrappedView->topAnchor().constraintEqualToAnchor(topAnchor()),
                                         _wrappedView->bottomAnchor().constraintEqualToAnchor(bottomAnchor())});
}

}  // namespace nimbo
