#pragma once

#include <optional>
#include <stdexcept>
#include <utility>

#include "platform/foundation/Error.h"

namespace nimbo {

/// What an operation answers: a value, or the error that kept it from one.
template <class T>
class [[nodiscard]] Outcome {
 public:
  Outcome(T value) : _value(std::move(value)) {}
  /// Throws std::invalid_argument for a null error.
  Outcome(ErrorRef error) : _error(std::move(error)) {
    if (!_error) throw std::invalid_argument("an outcome without a value needs an error");
  }

  /// Whether there is a value.
  explicit operator bool() const { return _value.has_value(); }
  /// Only with a value.
  T& operator*() { return *_value; }
  const T& operator*() const { return *_value; }
  T* operator->() { return &*_value; }
  const T* operator->() const { return &*_value; }
  /// Null with a value.
  const ErrorRef& error() const { return _error; }

 private:
  std::optional<T> _value;
  ErrorRef _error;
};

}  // namespace nimbo
