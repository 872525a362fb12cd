#pragma once

#include <memory>

#include "platform/ui/View.h"
#include "platform/ui/VisualEffect.h"

namespace nimbo {

/// Texts and images in its content view are shown in the effect's colour.
class VisualEffectView : public View {
 public:
  /// Without an effect, everything keeps its colours.
  explicit VisualEffectView(std::shared_ptr<const VisualEffect> effect);

  const std::shared_ptr<const VisualEffect>& effect() const { return _effect; }
  /// As large as this view.
  const std::shared_ptr<View>& contentView() const { return _contentView; }

  std::string_view className() const override { return "VisualEffectView"; }

 protected:
  DrawingContext contextForSubviews(const DrawingContext& context) const override;

 private:
  std::shared_ptr<const VisualEffect> _effect;
  std::shared_ptr<View> _contentView;
};

}  // namespace nimbo
