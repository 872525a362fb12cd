#include <gtest/gtest.h>

#include "items/NumberList.h"

namespace nimbo {
namespace {

TEST(NumberList, FindsTheFirstEqualNumberInListsOfEveryLength) {
  NumberList list;
  for (std::uint64_t i = 0; i < 300; ++i) {
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
