#include "ui/DynamicTypeValue.h"

namespace nimbo {

double DynamicTypeValue::scaledValue() const {
  const FontRef font = _fontProvider ? _fontProvider() : nullptr;
  return font ? font->_scaledValueForValue(_unscaledValue) : _unscaledValue;
}

}  // namespace nimbo
