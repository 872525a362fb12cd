#include "platform/foundation/Boxed.h"

#include <cmath>
#include <cstdio>
#include <type_traits>
#include <utility>

#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

std::string_view asText(const Bytes& bytes) { return {reinterpret_cast<const char*>(bytes.data()), bytes.size()}; }

bool numbersEqual(const BoxedNumber::Value& a, const BoxedNumber::Value& b) {
  return std::visit(
      [](auto x, auto y) {
        using X = decltype(x);
        using Y = decltype(y);
        if constexpr (std::is_same_v<X, Y>) {
          return x == y;
        } else if constexpr (std::is_same_v<X, bool> || std::is_same_v<Y, bool>) {
          return false;
        } else if constexpr (std::is_integral_v<X> && std::is_integral_v<Y>) {
          return std::cmp_equal(x, y);
        } else {
          return static_cast<double>(x) == static_cast<double>(y);
        }
      },
      a, b);
}

}  // namespace

bool BoxedString::isEqual(const Object* other) const {
  const auto* string = instanceOf<BoxedString>(other);
  return string && string->_value == _value;
}

std::uint64_t BoxedString::hash() const { return hashOfBytes(_value); }

bool BoxedNumber::isEqual(const Object* other) const {
  const auto* number = instanceOf<BoxedNumber>(other);
  return number && numbersEqual(_value, number->_value);
}

std::uint64_t BoxedNumber::hash() const {
  return std::visit([](auto value) { return hashOfDouble(static_cast<double>(value)); }, _value);
}

std::string BoxedNumber::description() const {
  if (const bool* flag = std::get_if<bool>(&_value)) return *flag ? "YES" : "NO";
  if (const double* number = std::get_if<double>(&_value)) {
    char text[32];
    std::snprintf(text, sizeof text, "%.17g", *number);
    return text;
  }
  return std::visit([](auto value) { return std::to_string(value); }, _value);
}

bool BoxedData::isEqual(const Object* other) const {
  const auto* data = instanceOf<BoxedData>(other);
  return data && data->_value == _value;
}

std::uint64_t BoxedData::hash() const { return hashOfBytes(asText(_value)); }

std::string BoxedData::description() const {
  constexpr std::size_t kShown = 16;
  std::string text = "{length = " + std::to_string(_value.size()) + ", bytes = 0x";
  for (std::size_t i = 0; i < _value.size() && i < kShown; ++i) {
    char digits[3];
    std::snprintf(digits, sizeof digits, "%02x", static_cast<unsigned>(_value[i]));
    text += digits;
  }
  return text + (_value.size() > kShown ? "...}" : "}");
}

bool BoxedDate::isEqual(const Object* other) const {
  const auto* date = instanceOf<BoxedDate>(other);
  return date && date->_value == _value;
}

std::uint64_t BoxedDate::hash() const {
  return static_cast<std::uint64_t>(_value.time_since_epoch().count()) * kHashMultiplier;
}

bool BoxedArray::isEqual(const Object* other) const {
  if (this == other) return true;
  const auto* array = instanceOf<BoxedArray>(other);
  if (!array || array->_elements.size() != _elements.size()) return false;
  for (std::size_t i = 0; i < _elements.size(); ++i)
    if (!absentOrEqual(_elements[i], array->_elements[i])) return false;
  return true;
}

std::string BoxedArray::description() const {
  std::string text = "(";
  for (const ObjectRef& element : _elements) {
    if (text.size() > 1) text += ", ";
    text += descriptionOf(element);
  }
  return text + ")";
}

ObjectRef BoxedDictionary::objectForKey(std::string_view key) const {
  const auto entry = _entries.find(key);
  return entry == _entries.end() ? nullptr : entry->second;
}

bool BoxedDictionary::isEqual(const Object* other) const {
  if (this == other) return true;
  const auto* dictionary = instanceOf<BoxedDictionary>(other);
  if (!dictionary || dictionary->_entries.size() != _entries.size()) return false;
  auto theirs = dictionary->_entries.begin();
  for (const auto& [key, object] : _entries) {
    if (key != theirs->first || !absentOrEqual(object, theirs->second)) return false;
    ++theirs;
  }
  return true;
}

std::string BoxedDictionary::description() const {
  std::string text = "{";
  for (const auto& [key, object] : _entries) {
    if (text.size() > 1) text += "; ";
    text += key + " = " + descriptionOf(object);
  }
  return text + "}";
}

}  // namespace nimbo
