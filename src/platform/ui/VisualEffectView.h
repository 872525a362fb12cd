#pragma once

#include <cstdint>
#include <memory>

#include "platform/foundation/Object.h"
#include "platform/ui/Color.h"
#include "platform/ui/Environment.h"
#include "platform/ui/View.h"

namespace nimbo {

/// How the widget host lets texts and symbols stand out from its background, by style number:
///
///     101  primary texts
///     102  secondary texts and faded shields
///     103  separators and other faint lines; any other number gives the same
///
/// Texts in styles 101 and 102 have a contrast of 4.5 to 1 or more on the widget's background. Immutable.
class VisualEffect final : public Object {
 public:
  static std::shared_ptr<const VisualEffect> widgetEffectForVibrancyStyle(std::int64_t style);
  static std::shared_ptr<const VisualEffect> widgetTertiaryVibrancyEffect();
  explicit VisualEffect(std::int64_t vibrancyStyle) : _vibrancyStyle(vibrancyStyle) {}

  Color color(Appearance appearance) const;
  std::string_view className() const override { return "VisualEffect"; }

 private:
  std::int64_t _vibrancyStyle;
};

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
