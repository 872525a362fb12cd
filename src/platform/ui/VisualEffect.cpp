#include "platform/ui/VisualEffect.h"

namespace nimbo {

namespace {
constexpr std::int64_t kTertiaryVibrancyStyle = 103;
}

std::shared_ptr<const VisualEffect> VisualEffect::widgetEffectForVibrancyStyle(std::int64_t style) {
  return std::make_shared<const VisualEffect>(style);
}

std::shared_ptr<const VisualEffect> VisualEffect::widgetTertiaryVibrancyEffect() {
  return widgetEffectForVibrancyStyle(kTertiaryVibrancyStyle);
}

}  // namespace nimbo
