#include <gtest/gtest.h>

#include "incidents/Result.h"

namespace nimbo {
namespace {

ErrorRef error(int code) { return Error::errorWithDomain_code_reason("Domain", code, "reason"); }
ResultRef success(const char* text) { return Result::resultWithValue(box(text)); }

TEST(Result, ComparesWhatItHolds) {
  const ResultRef results[] = {success("v"), success("w"), Result::resultWithValue(box(1)),
                               Result::resultWithError(error(1)), Result::resultWithError(error(2))};
  for (std::size_t i = 0; i < std::size(results); ++i)
    for (std::size_t j = 0; j < std::size(results); ++j)
      EXPECT_EQ(results[i]->isEqual(results[j].get()), i == j) << i << " " << j;

  const ResultRef array = Result::resultWithValue(BoxedArray::of<Object>({box("a"), box(2)}));
  const ResultRef sameArray = Result::resultWithValue(BoxedArray::of<Object>({box("a"), box(2)}));
  EXPECT_TRUE(array->isEqual(sameArray.get()));
  EXPECT_EQ(array->hash(), sameArray->hash());
}

}  // namespace
}  // namespace nimbo
