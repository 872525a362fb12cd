#include <gmock/gmock.h>

#include "items/NumberList.h"
#include "util/NimboMap.h"

namespace nimbo {
namespace {

using testing::ElementsAre;

TEST(NimboMap, DropsAbsentAnswersAndCountsTheInput) {
  const auto mapped = NimboMap(std::vector<std::string>{"a", "b", "c"}, [](const std::string& text, std::size_t index) {
    return text == "b" ? std::nullopt : std::optional(text + std::to_string(index));
  });
  EXPECT_THAT(mapped, ElementsAre("a0", "c2"));
  const auto pointers = NimboMap(std::vector<int>{1, 2}, [](int number, std::size_t) {
    return number == 1 ? nullptr : std::make_shared<int>(number);
  });
  ASSERT_EQ(pointers.size(), 1u);
  EXPECT_EQ(*pointers[0], 2);
}

TEST(NimboMap, KeepsAbsentApartFromEmpty) {
  const auto unreachable = [](int, std::size_t) -> std::optional<int> { throw std::logic_error("called"); };
  EXPECT_EQ(NimboMap(std::optional<std::vector<int>>(), unreachable), std::nullopt);
  EXPECT_EQ(NimboMap(std::optional(std::vector<int>()), unreachable), std::vector<int>());
}

TEST(NumberList, FindsTheFirstEqualNumberInListsOfEveryLength) {
  NumberList list;
  for (std::uint64_t i = 0; i < 100; ++i) {
    EXPECT_EQ(list.firstIndexOf(i << 32), list.count());
    list.append(i << 32);
    for (std::uint64_t j = 0; j <= i; ++j) ASSERT_EQ(list.firstIndexOf(j << 32), j);
    ASSERT_EQ(list.firstIndexOf(i), i == 0 ? 0u : list.count()) << "folds to the same as another number";
  }
  list.replace(70, std::uint64_t{40} << 32);
  EXPECT_EQ(list.firstIndexOf(std::uint64_t{40} << 32, 41), 70u);
  EXPECT_EQ(list.firstIndexOf(std::uint64_t{70} << 32), list.count());
}

}  // namespace
}  // namespace nimbo
