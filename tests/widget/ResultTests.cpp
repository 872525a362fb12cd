#include <gmock/gmock.h>

#include "incidents/Result.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using testing::ElementsAre;
using Texts = std::vector<std::string>;

ErrorRef error(int code) { return Error::errorWithDomain_code_reason("Domain", code, "reason"); }
ResultRef success(const char* text) { return Result::resultWithValue(box(text)); }

TEST(Result, CallsTheBlockForWhatItHoldsAndComplainsOfMissingOnes) {
  TestPlatform platform;
  const std::string complaint = "Neither block can be nil but ";
  const struct {
    ResultRef result;
    bool valueBlock, errorBlock;
    std::string called;
    Texts logged;
  } cases[] = {
      {success("v"), true, true, "v", {}},
      {success("v"), true, false, "v", {complaint + "error block is nil."}},
      {success("v"), false, true, "", {complaint + "value block is nil.", "Had a value but no value block"}},
      {success("v"), false, false, "", {complaint + "both are nil.", "Had a value but no value block"}},
      {Result::resultWithError(error(7)), true, true, "7", {}},
      {Result::resultWithError(error(7)), false, true, "7", {complaint + "value block is nil."}},
      {Result::resultWithError(error(7)),
       true,
       false,
       "",
       {complaint + "error block is nil.", "Had an error but no error block"}},
  };
  for (const auto& [result, valueBlock, errorBlock, expected, logged] : cases) {
    std::string called;
    platform.log.clear();
    result->withValue_orError(
        valueBlock ? Result::ValueBlock([&](const ObjectRef& value) { called += value->description(); }) : nullptr,
        errorBlock ? Result::ErrorBlock([&](const ErrorRef& e) { called += std::to_string(e->code()); }) : nullptr);
    EXPECT_EQ(called, expected);
    EXPECT_EQ(platform.log.texts("Result", LogLevel::error), logged);
  }
}

TEST(Result, ComparesWhatItHolds) {
  class DerivedResult final : public Result {
   public:
    DerivedResult() : Result(box("v"), nullptr, true) {}
  };
  const ResultRef results[] = {success("v"), success("w"), Result::resultWithValue(box(1)),
                               Result::resultWithError(error(1)), Result::resultWithError(error(2))};
  for (std::size_t i = 0; i < std::size(results); ++i)
    for (std::size_t j = 0; j < std::size(results); ++j)
      EXPECT_EQ(results[i]->isEqual(results[j].get()), i == j) << i << " " << j;

  const ResultRef array = Result::resultWithValue(BoxedArray::of<Object>({box("a"), box(2)}));
  const ResultRef sameArray = Result::resultWithValue(BoxedArray::of<Object>({box("a"), box(2)}));
  EXPECT_TRUE(array->isEqual(sameArray.get()));
  EXPECT_EQ(array->hash(), sameArray->hash());
  EXPECT_FALSE(success("v")->isEqual(box("v").get()));
  EXPECT_FALSE(success("v")->isEqual(std::make_shared<DerivedResult>().get()));
  EXPECT_EQ(success("v")->hash(), box("v")->hash() ^ 2654435761u);
  EXPECT_EQ(Result::resultWithError(error(1))->hash(), error(1)->hash());
}

TEST(Result, MapsSuccessesAndPassesErrorsOn) {
  const auto failed = Result::resultWithError(error(1));
  const auto unreachable = [](const ObjectRef&) -> ObjectRef { throw std::logic_error("called"); };
  EXPECT_EQ(failed->map(unreachable), failed);
  EXPECT_EQ(failed->flatMap([](const ObjectRef&) -> ResultRef { throw std::logic_error("called"); }), failed);

  EXPECT_TRUE(
      success("v")->map([](const ObjectRef& v) { return box(v->description() + "!"); })->isEqual(success("v!").get()));
  EXPECT_EQ(success("v")->flatMap([&](const ObjectRef&) { return failed; }), failed);
  EXPECT_THROW(success("v")->map([](const ObjectRef&) { return ObjectRef(); }), std::invalid_argument);
  EXPECT_THROW(Result::resultWithValue(nullptr), std::invalid_argument);
  EXPECT_THROW(Result::resultWithError(nullptr), std::invalid_argument);
}

TEST(Result, DescribesItsContentInsideTheBrackets) {
  EXPECT_THAT(success("the value")->description(), testing::MatchesRegex("<Result: 0x[0-9a-f]+ the value>"));
}

}  // namespace
}  // namespace nimbo
