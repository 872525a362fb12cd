#include "platform/ui/VisualEffectView.h"

#include "platform/ui/DrawingContext.h"

namespace nimbo {

VisualEffectView::VisualEffectView(std::shared_ptr<const VisualEffect> effect)
    : _effect(std::move(effect)), _contentView(std::make_shared<View>()) {
  addFillingSubview(_contentView);
}

DrawingContext VisualEffectView::contextForSubviews(const DrawingContext& context) const {
  DrawingContext inner = context;
  if (_effect) inner.vibrantColor = _effect->color(context.appearance);
  return inner;
}

}  // namespace nimbo
