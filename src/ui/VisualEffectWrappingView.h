#pragma once

#include <memory>

#include "platform/ui/VisualEffectView.h"

namespace nimbo {

/// Shows one view, as large as itself, in a visual effect.
class VisualEffectWrappingView final : public VisualEffectView {
 public:
  using VisualEffectView::VisualEffectView;

  const std::shared_ptr<View>& wrappedView() const { return _wrappedView; }
  /// Replaces the view that was shown; null shows nothing.
  void setWrappedView(std::shared_ptr<View> view);

  View* viewForFirstBaselineLayout() override { return _wrappedView.get(); }
  View* viewForLastBaselineLayout() override { return _wrappedView.get(); }

  std::string_view className() const override { return "VisualEffectWrappingView"; }

 private:
  std::shared_ptr<View> _wrappedView;
};

}  // namespace nimbo
