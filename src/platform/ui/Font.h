#pragma once

#include <cstdint>
#include <memory>

#include "platform/ui/TextStyles.h"
#include "platform/ui/TextSystem.h"

namespace nimbo {

/// Traits added to a style's face; the values are those of the hosts' font descriptors.
enum class FontTraits : std::uint32_t { none = 0, bold = 2 };

/// A face at a size. Immutable. Main thread only.
class Font final : public Object {
 public:
  /// The font of a style at the user's present text size.
  static std::shared_ptr<const Font> preferredFont(TextStyle style, FontTraits traits = FontTraits::none);
  Font(FontDescriptor descriptor, double scaling);

  const FontDescriptor& descriptor() const { return _descriptor; }
  /// Points; of the face itself.
  double capHeight() const { return _metrics.capHeight; }
  double lineHeight() const { return _metrics.ascent + _metrics.descent; }
  double ascent() const { return _metrics.ascent; }
  double descent() const { return _metrics.descent; }

  /// A length given for the default text size, as much larger or smaller as this font is.
  double _scaledValueForValue(double value) const { return value * _scaling; }

  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::string_view className() const override { return "Font"; }

 private:
  FontDescriptor _descriptor;
  double _scaling;
  FontMetrics _metrics;
};

using FontRef = std::shared_ptr<const Font>;

}  // namespace nimbo
