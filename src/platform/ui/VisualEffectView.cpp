#include "platform/ui/VisualEffectView.h"

#include "platform/ui/Painter.h"

namespace nimbo {

namespace {

constexpr std::int64_t kPrimaryStyle = 101;
constexpr std::int64_t kSecondaryStyle = 102;
constexpr std::int64_t kTertiaryStyle = 103;

constexpr Color grey(int level) { return {level / 255.0, level / 255.0, level / 255.0, 1}; }

}  // namespace

std::shared_ptr<const VisualEffect> VisualEffect::widgetEffectForVibrancyStyle(std::int64_t style) {
  return std::make_shared<const VisualEffect>(style);
}

std::shared_ptr<const VisualEffect> VisualEffect::widgetTertiaryVibrancyEffect() {
  return widgetEffectForVibrancyStyle(kTertiaryStyle);
}

Color VisualEffect::color(Appearance appearance) const {
  const bool dark = appearance == Appearance::dark;
  switch (_vibrancyStyle) {
    case kPrimaryStyle:
      return grey(dark ? 250 : 20);
    case kSecondaryStyle:
      return grey(dark ? 180 : 86);
    default:
      return grey(dark ? 74 : 200);
  }
}

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
