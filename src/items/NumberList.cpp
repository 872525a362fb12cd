#include "items/NumberList.h"

#include <algorithm>

namespace nimbo {

void NumberList::append(std::uint64_t value) {
  _folded.push_back(fold(value));
  _values.push_back(value);
}

void NumberList::replace(std::size_t index, std::uint64_t value) {
  _folded.at(index) = fold(value);
  _values[index] = value;
}

std::size_t NumberList::firstIndexOf(std::uint64_t value, std::size_t from) const {
  constexpr std::size_t kBlock = 128;  // compared without a branch, so that the compiler uses vector instructions
  const std::uint16_t folded = fold(value);
  const std::size_t count = _folded.size();
  std::size_t index = from;
  while (index < count) {
    std::uint16_t hits = index + kBlock > count ? 1 : 0;
    if (!hits)
      for (std::size_t i = 0; i < kBlock; ++i) hits |= static_cast<std::uint16_t>(-(_folded[index + i] == folded));
    if (!hits) {
      index += kBlock;
      continue;
    }
    for (const std::size_t end = std::min(index + kBlock, count); index < end; ++index)
      if (_values[index] == value) return index;
  }
  return count;
}

}  // namespace nimbo
