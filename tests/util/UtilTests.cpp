#include <gmock/gmock.h>

#include "platform/transit/IncidentStringProvider.h"
#include "support/TransitFixtures.h"
#include "util/NimboMap.h"

namespace nimbo {
namespace {

using testing::ElementsAre;

TEST(NimboMap, KeepsInOrderWhatIsAnsweredForElementsAndTheirPositions) {
  std::vector<std::size_t> positions;
  const auto doubledIfOdd = [&](int element, std::size_t position) {
    positions.push_back(position);
    return element % 2 == 1 ? std::make_shared<int>(2 * element) : nullptr;
  };
  EXPECT_THAT(NimboMap(std::vector{1, 2, 3}, doubledIfOdd), ElementsAre(testing::Pointee(2), testing::Pointee(6)));
  EXPECT_THAT(positions, ElementsAre(0, 1, 2));
  EXPECT_THAT(NimboMap(std::optional(std::vector{2}), doubledIfOdd), testing::Optional(testing::IsEmpty()));
  EXPECT_EQ(NimboMap(std::optional<std::vector<int>>(), doubledIfOdd), std::nullopt);
  EXPECT_THAT(NimboMap(std::vector{1}, [](int one, std::size_t) { return std::optional(one); }), ElementsAre(1));
}

TEST(IncidentStringProvider, FillsBothTextsWithWhatIsThereAndShowsNoneTwice) {
  using Text = std::optional<std::string>;
  const struct {
    Text title, summary, description;
    const char *first, *second;
  } cases[] = {{"T", "S", "D", "T", "S"}, {"T", "", "D", "T", "D"}, {"T", {}, {}, "T", ""},
               {{}, "S", "D", "S", ""},   {"", "S", "D", "S", ""},  {"S", "S", "D", "S", ""},
               {"T", {}, "T", "T", ""},   {{}, {}, "D", "", "D"},   {{}, {}, {}, "", ""}};
  for (const auto& test : cases) {
    TransitIncidentFields fields;
    fields.title = test.title;
    fields.summary = test.summary;
    fields.fullDescription = test.description;
    const BasicTransitIncident incident(fields);
    EXPECT_EQ(IncidentStringProvider::cellTitleForIncident(&incident), test.first);
    EXPECT_EQ(IncidentStringProvider::cellSecondaryTextForIncident(&incident), test.second);
  }
  EXPECT_EQ(IncidentStringProvider::cellTitleForIncident(nullptr), "");
  EXPECT_EQ(IncidentStringProvider::cellSecondaryTextForIncident(nullptr), "");
}

}  // namespace
}  // namespace nimbo
