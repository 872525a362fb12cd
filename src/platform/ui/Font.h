#pragma once

#include <cstdint>
#include <memory>

#include "platform/ui/Environment.h"
#include "platform/ui/TextSystem.h"

namespace nimbo {

/// What a text is for, from which its size follows.
enum class TextStyle { headline, subheadline, body };

/// The point size of a style at a text size. The table, in points:
///
///     text size                            headline, body   subheadline
///     extraSmall                                 14              12
///     small                                      15              13
///     medium                                     16              14
///     large (the size at which lengths           17              15
///            are given)
///     extraLarge                                 19              17
///     extraExtraLarge                            21              19
///     extraExtraExtraLarge                       23              21
///     accessibilityMedium                        28              25
///     accessibilityLarge                         33              30
///     accessibilityExtraLarge                    40              36
///     accessibilityExtraExtraLarge               47              42
///     accessibilityExtraExtraExtraLarge          53              49
double pointSizeForTextStyle(TextStyle style, ContentSizeCategory category);

/// How much larger or smaller than at the size `large` a headline is.
double textScaleForCategory(ContentSizeCategory category);

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
