#pragma once

#include <functional>
#include <memory>

#include "platform/ui/Font.h"

namespace nimbo {

/// Answers the font that a text or a length follows, at the present text size; may answer null.
using FontProvider = std::function<FontRef()>;

/// A length that grows and shrinks with a font. Main thread only.
class DynamicTypeValue final : public Object {
 public:
  /// The length in points at the default text size; the provider may be empty.
  DynamicTypeValue(double unscaledValue, FontProvider fontProvider)
      : _fontProvider(std::move(fontProvider)), _unscaledValue(unscaledValue) {}

  const FontProvider& fontProvider() const { return _fontProvider; }
  void setFontProvider(FontProvider fontProvider) { _fontProvider = std::move(fontProvider); }
  double unscaledValue() const { return _unscaledValue; }
  void setUnscaledValue(double value) { _unscaledValue = value; }

  /// Points, at the font's present size; without a font the unscaled value.
  double scaledValue() const;

  std::string_view className() const override { return "DynamicTypeValue"; }

 private:
  FontProvider _fontProvider;
  double _unscaledValue;
};

}  // namespace nimbo
