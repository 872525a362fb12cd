#pragma once

#include <cstdint>
#include <memory>

#include "platform/foundation/Object.h"

namespace nimbo {

/// How the widget host lets texts and symbols stand out from its background, by style number. Immutable.
class VisualEffect final : public Object {
 public:
  static std::shared_ptr<const VisualEffect> widgetEffectForVibrancyStyle(std::int64_t style);
  /// The effect of separators and other faint lines.
  static std::shared_ptr<const VisualEffect> widgetTertiaryVibrancyEffect();
  explicit VisualEffect(std::int64_t vibrancyStyle) : _vibrancyStyle(vibrancyStyle) {}

  std::int64_t vibrancyStyle() const { return _vibrancyStyle; }
  std::string_view className() const override { return "VisualEffect"; }

 private:
  std::int64_t _vibrancyStyle;
};

}  // namespace nimbo
