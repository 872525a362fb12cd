#pragma once

#include <concepts>
#include <cstddef>
#include <optional>
#include <type_traits>
#include <utility>
#include <vector>

namespace nimbo {

namespace detail {
template <class T>
struct MappedValue {
  using type = T;  // a pointer: null drops the element
};
template <class T>
struct MappedValue<std::optional<T>> {
  using type = T;
};
}  // namespace detail

/// A new array of what `transform(element, index)` answers for each element in order; an absent answer (a null pointer
/// or an empty optional) drops its element. The index counts the elements of the input. The array must not change
/// meanwhile.
template <class T, std::invocable<const T&, std::size_t> Transform>
auto NimboMap(const std::vector<T>& array, Transform transform) {
  using Answer = std::invoke_result_t<Transform&, const T&, std::size_t>;
  std::vector<typename detail::MappedValue<Answer>::type> result;
  result.reserve(array.size());
  for (std::size_t index = 0; index < array.size(); ++index) {
    Answer answer = transform(array[index], index);
    if (!answer) continue;
    if constexpr (std::is_same_v<typename detail::MappedValue<Answer>::type, Answer>)
      result.push_back(std::move(answer));
    else
      result.push_back(*std::move(answer));
  }
  return result;
}

/// As above; no array gives no array, and the transform is never called.
template <class T, std::invocable<const T&, std::size_t> Transform>
auto NimboMap(const std::optional<std::vector<T>>& array, Transform transform)
    -> std::optional<decltype(NimboMap(*array, transform))> {
  if (!array) return std::nullopt;
  return NimboMap(*array, std::move(transform));
}

}  // namespace nimbo
