#include "incidents/Result.h"
#include "platform/foundation/Hash.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

ErrorRef error(int code) { return Error::errorWithDomain_code_reason("Domain", code, "reason"); }
ResultRef success(const char* text) { return Result::resultWithValue(box(text)); }

/// A result that means more.
class Special final : public Result {
 public:
  Special() : Result(box("v"), nullptr, true) {}
};

TEST(Result, ComparesWhatItHolds) {
  const ResultRef results[] = {success("v"), success("w"), Result::resultWithValue(box(1)),
                               Result::resultWithError(error(1)), Result::resultWithError(error(2)),
                               // What an error result holds says nothing about a success that holds an equal object.
                               Result::resultWithValue(error(1))};
  for (std::size_t i = 0; i < std::size(results); ++i)
    for (std::size_t j = 0; j < std::size(results); ++j)
      EXPECT_EQ(results[i]->isEqual(results[j].get()), i == j) << i << " " << j;
  EXPECT_FALSE(results[0]->isEqual(nullptr));
  EXPECT_FALSE(results[0]->isEqual(box("v").get()));
  EXPECT_FALSE(results[0]->isEqual(std::make_shared<const Special>().get()));

  const ResultRef array = Result::resultWithValue(BoxedArray::of<Object>({box("a"), box(2)}));
  const ResultRef sameArray = Result::resultWithValue(BoxedArray::of<Object>({box("a"), box(2)}));
  EXPECT_TRUE(array->isEqual(sameArray.get()));
  EXPECT_EQ(array->hash(), 2 ^ kHashMultiplier);
  EXPECT_EQ(results[3]->hash(), error(1)->hash());
  EXPECT_THAT(success("v")->description(), testing::MatchesRegex("<Result: 0x[0-9a-f]+ v>"));
}

TEST(Result, CallsTheBlockOfWhatItHoldsAndComplainsOfMissingOnes) {
  const std::string start = "Neither block can be nil but ";
  const struct {
    bool isSuccess, hasValueBlock, hasErrorBlock;
    std::string called;
    std::vector<std::string> complaints;
  } cases[] = {
      {true, true, true, "value v", {}},
      {false, true, true, "error 1", {}},
      {true, true, false, "value v", {start + "error block is nil."}},
      {false, false, true, "error 1", {start + "value block is nil."}},
      {true, false, true, "", {start + "value block is nil.", "Had a value but no value block"}},
      {false, true, false, "", {start + "error block is nil.", "Had an error but no error block"}},
      {true, false, false, "", {start + "both are nil.", "Had a value but no value block"}},
      {false, false, false, "", {start + "both are nil.", "Had an error but no error block"}},
  };
  for (const auto& c : cases) {
    const TestPlatform platform;
    const ResultRef result = c.isSuccess ? success("v") : Result::resultWithError(error(1));
    EXPECT_EQ(result->isSuccess(), c.isSuccess);
    std::string called;
    const Result::ValueBlock valueBlock = [&](const ObjectRef& value) { called += "value " + value->description(); };
    const Result::ErrorBlock errorBlock = [&](const ErrorRef& e) { called += "error " + std::to_string(e->code()); };
    result->withValue_orError(c.hasValueBlock ? valueBlock : nullptr, c.hasErrorBlock ? errorBlock : nullptr);
    EXPECT_EQ(called, c.called);
    EXPECT_THAT(platform.log.texts("Result", LogLevel::error), testing::ElementsAreArray(c.complaints));
  }
}

TEST(Result, MapsValuesAndPassesErrorsOn) {
  const auto doubled = [](const ObjectRef& value) { return box(value->description() + value->description()); };
  const ResultRef failed = Result::resultWithError(error(1)), other = success("other");
  EXPECT_TRUE(success("v")->map(doubled)->isEqual(success("vv").get()));
  EXPECT_EQ(success("v")->flatMap([&](const ObjectRef&) { return other; }), other);
  EXPECT_EQ(failed->map(doubled), failed);
  EXPECT_EQ(failed->flatMap([&](const ObjectRef&) { return other; }), failed);
  EXPECT_THROW(success("v")->map([](const ObjectRef&) { return nullptr; }), std::invalid_argument);
  EXPECT_THROW(Result::resultWithError(nullptr), std::invalid_argument);
}

}  // namespace
}  // namespace nimbo
