#include <cctype>

#include "analytics/NBTransitIncidentsAnalyticsDelegate.h"
#include "handoff/NBOpenable.h"
#include "handoff/NBUserActivityData.h"
#include "items/NBTransitIncidentsDataSourceBuilder.h"
#include "items/NBTransitItemDataSourceBuilder.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/artwork/ArtworkImageSource.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using Rows = std::vector<std::string>;

/// Lines from a text such as "A:1,2 B: C/rail:2": a line for each word, with its system after a slash and its
/// incidents by number after the colon; a small letter is a line without a shield. The same number is the same
/// incident, of another object on each line; numbers with the same last digit have the same texts: 0 none, 8 only a
/// description, 9 is still to start.
class Network {
 public:
  explicit Network(const std::string& text) {
    std::istringstream words(text);
    for (std::string word; words >> word;) {
      const std::string name = word.substr(0, word.find_first_of("/:"));
      const auto slash = word.find('/'), colon = word.find(':');
      TransitIncidents incidents;
      std::istringstream numbers(word.substr(colon + 1));
      for (std::string number; std::getline(numbers, number, ',');) incidents.push_back(numbered(std::stoul(number)));
      const std::string system = slash < colon ? word.substr(slash + 1, colon - slash - 1) : "";
      const bool hasShield = std::isupper(static_cast<unsigned char>(name.front())) != 0;
      lines.push_back(lineItem(100 + lines.size(), name, std::move(incidents), systemNamed(system), hasShield));
    }
  }

  /// "title | text | artwork at alpha | what opens".
  std::string textOf(const NBTransitItem& item) const {
    return item.primaryText().value_or("-") + " | " + item.secondaryText().value_or("-") + " | " +
           textOf(item.artwork()) + (item.isArtworkHidden() ? "hidden" : "") + " | " + textOf(item.openable());
  }
  Rows textsOf(const NBTransitItems& items) const {
    Rows rows;
    for (const auto& item : items) rows.push_back(textOf(*item));
    return rows;
  }
  /// A summary row is "text | its shields | what opens".
  std::string textOfSummary(const ObjectRef& summary) const {
    if (const auto* item = dynamic_cast<const NBTransitItem*>(summary.get())) return textOf(*item);
    const auto& item = dynamic_cast<const NBTransitSummaryItem&>(*summary);
    std::string text = item.primaryText() + " | ";
    for (const auto& shield : item.artworks()) text += textOf(*shield);
    return text + " | " + textOf(item.userActivityData());
  }

  TransitLineItems lines;

 private:
  static TransitIncidentRef numbered(std::uint64_t number) {
    if (number == 9) return incident(9, dateByAdding(TestPlatform::startDate(), 1));
    auto fields = dynamic_cast<const BasicTransitIncident&>(*incident(number % 10)).fields();
    fields.muid = number;
    if (number == 0 || number == 8) fields.title = fields.summary = std::nullopt;
    if (number == 8) fields.fullDescription = "Description";
    return std::make_shared<const BasicTransitIncident>(std::move(fields));
  }
  static TransitSystemRef systemNamed(const std::string& name) {
    if (name.empty()) return nullptr;
    const auto mode = name == "rail" ? TransitMode::rail : name == "bus" ? TransitMode::bus : TransitMode::unknown;
    return std::make_shared<const TransitSystem>(1, name, mode == TransitMode::unknown ? nullptr : modeArtwork(mode));
  }
  static std::string textOf(const NBConfiguredArtworkRef& artwork) {
    if (!artwork) return "";
    const std::string alpha = artwork->alpha() == 1 ? "" : artwork->alpha() == 0.30000001192092896 ? " dimmed" : " ?";
    if (const auto* named = dynamic_cast<const NamedImage*>(artwork->artworkSource().get()))
      return named->name() + alpha;
    const auto& sized = dynamic_cast<const SizedTransitArtwork&>(*artwork->artworkSource());
    EXPECT_EQ(sized.shieldSize(), 7);
    return (sized.artwork() ? textOf(*sized.artwork()) : "no shield") + alpha;
  }
  static std::string textOf(const TransitArtwork& artwork) {
    if (artwork.shieldDataSource()) return *artwork.shieldDataSource()->shieldText;
    return "mode " + std::to_string(artwork.iconDataSource()->defaultTransitType);
  }
  std::string textOf(const NBOpenableRef& openable) const {
    if (!openable) return "-";
    if (const auto* url = dynamic_cast<const NBURLOpenable*>(openable.get())) return url->url().absoluteString();
    for (const auto& line : lines)
      if (openable->isEqual(activityDataForLineItem(line).get())) return "line " + *line->name();
    return dynamic_cast<const NBUserActivityData&>(*openable).activityType() ==
                   kNimboTransitWidgetIncidentSummaryActivityType
               ? "list"
               : "?";
  }
};

class ListBuilder : public testing::Test {
 protected:
  NBTransitListItemRef build(const Network& network, std::uint64_t limit = 0) {
    return NBTransitDataSourceBuilderForResult(Result::resultWithValue(BoxedArray::of(network.lines)), limit, cache,
                                               session)
        ->listItem();
  }
  void expectRows(const std::string& text, std::uint64_t limit, const std::string& summary, const Rows& expanded) {
    const Network network(text);
    const auto list = build(network, limit);
    EXPECT_EQ(network.textOfSummary(list->summaryItem()), summary) << text << " limit " << limit;
    ASSERT_TRUE(list->expandedItems());
    EXPECT_EQ(network.textsOf(*list->expandedItems()), expanded) << text << " limit " << limit;
  }

  TestPlatform platform;
  std::shared_ptr<ArtworkCache> cache = ArtworkCache::initWithArtworkManager(nullptr);
  std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> session =
      NBTransitIncidentsAnalyticsDelegate::initWithTransitIncidentsViewController({});
};

const std::string kFavoritesURL = "nimbo://?favorites=2&t=r&session=00000000000000000000000000000000";
const std::string kClear = " | good-alt-v2 dimmed | " + kFavoritesURL;

std::string row(int number, const std::string& line) {
  const std::string n = std::to_string(number);
  return "Incident " + n + " | Summary " + n + " | " + line + " | line " + line;
}
std::string clearRow(int lines) {
  return "TransitWidget_GoodService_Title | TransitWidget_GoodService_Overflow_SecondaryText(" + std::to_string(lines) +
         ")" + kClear;
}
std::string overflowRow(int incidents, int lines) {
  return "TransitWidget_advisory_overflow_title(" + std::to_string(incidents) +
         ") | TransitWidget_AdvisoriesOverflow_SecondaryText(" + std::to_string(lines) +
         ") | advisories-v2 dimmed | list";
}
std::string summary(int incidents, const std::string& shields) {
  return "TransitWidget_Summary_advisory_count(" + std::to_string(incidents) + ") | " + shields + " | list";
}

TEST_F(ListBuilder, ChoosesTheCompactRowAndTheExpandedRows) {
  const std::string noFavorites =
      "TransitWidget_NoFavoriteTransitLines_Title | TransitWidget_NoFavoriteTransitLines_SecondaryText | hidden | "
      "nimbo://?t=r";
  const auto allClear = [](int lines) {
    return "TransitWidget_GoodService_Title | TransitWidget_GoodService_SecondaryText(" + std::to_string(lines) +
           ") | good-v2 | " + kFavoritesURL;
  };
  const struct {
    std::string network, summary;
    Rows expanded;
  } cases[] = {
      {"", noFavorites, {}},
      {"A:9 B:0 C:", allClear(3), {}},
      {"A:1", row(1, "A"), {}},
      {"A: B:1 C:9", row(1, "B"), {row(1, "B"), clearRow(2)}},
      {"A:8", " | Description | A | line A", {}},
      {"A/rail:1", row(1, "A"), {}},
      {"a/rail:1", "Incident 1 | Summary 1 | mode 3 | line a", {}},
      {"a:1", "Incident 1 | Summary 1 | no shield | line a", {}},
      {"A:1,2 B:", summary(2, "A"), {row(1, "A"), row(2, "A"), clearRow(1)}},
      {"A:1,0 B:2,9 A:0", summary(2, "AB"), {row(1, "A"), row(2, "B"), clearRow(1)}},
      {"A:1 A:2", summary(2, "A"), {row(1, "A"), row(2, "A")}},
  };
  for (const auto& [network, compact, expanded] : cases) expectRows(network, 0, compact, expanded);
}

TEST_F(ListBuilder, FoldsWhatIsOverTheLimitIntoOneRow) {
  const std::string five = "A:1,2,3 B:4,5", fiveAndClear = five + " C:";
  const struct {
    std::string network;
    std::uint64_t limit;
    Rows expanded;
  } cases[] = {
      {fiveAndClear, 6, {row(1, "A"), row(2, "A"), row(3, "A"), row(4, "B"), row(5, "B"), clearRow(1)}},
      {fiveAndClear, 5, {row(1, "A"), row(2, "A"), row(3, "A"), overflowRow(2, 1), clearRow(1)}},
      {fiveAndClear, 4, {row(1, "A"), row(2, "A"), overflowRow(3, 2), clearRow(1)}},
      {fiveAndClear, 2, {overflowRow(5, 2), clearRow(1)}},
      {fiveAndClear, 1, {overflowRow(5, 2)}},
      {five, 5, {row(1, "A"), row(2, "A"), row(3, "A"), row(4, "B"), row(5, "B")}},
      {five, 4, {row(1, "A"), row(2, "A"), row(3, "A"), overflowRow(2, 1)}},
      {five, 1, {overflowRow(5, 2)}},
  };
  for (int i = 0; i < 2; ++i, session = nullptr)  // also where nobody asks whose the incidents are
    for (const auto& [network, limit, expanded] : cases) expectRows(network, limit, summary(5, "AB"), expanded);
  expectRows("A:1 B:", 1, row(1, "A"), {row(1, "A"), clearRow(1)});  // a single incident is never capped
}

TEST_F(ListBuilder, ShowsAnIncidentOfSeveralLinesOnceWithTheirNames) {
  const auto merged = [](const std::string& artwork, const std::string& text) {
    return "Incident 1 | " + text + " | " + artwork + " | line A";
  };
  const std::string two = "TransitWidget_2_Lines_Prepended_Incident_Text(A, B, Summary 1)";
  const std::string three = "TransitWidget_N_Lines_Prepended_Incident_Text(A, B, C, Summary 1)";
  const std::string generic = "WidgetGenericTransit dimmed";
  const struct {
    std::string network, row;
  } cases[] = {
      {"A/rail:1 B/rail:1", merged("mode 3", two)},
      {"A/rail:1 B/bus:1", merged(generic, two)},
      {"A:1 B/rail:1", merged("mode 3", two)},
      {"A/rail:1 B:1", merged(generic, two)},
      {"A:1,1", merged(generic, "TransitWidget_Single_Line_Prepended_Incident_Text(A, Summary 1)")},
      {"A:1 B:1 A:1 C:1", merged(generic, three)},
      {"A:1 B/rail:1 C/rail:1", merged("mode 3", three)},
      {"A/rail:1 B:1 C/rail:1", merged(generic, three)},
  };
  for (const auto& [network, expected] : cases) expectRows(network, 0, expected, {});
  expectRows("A:1 B:1,2", 0, summary(2, "AB"), {merged(generic, two), row(2, "B")});
  // Of two rows that look alike, the first one's place is taken, and the lines go with it.
  expectRows("A:1,2,11 C:11 B:2 c:3", 0, summary(4, "ACB"),
             {merged(generic, "TransitWidget_2_Lines_Prepended_Incident_Text(A, C, Summary 1)"),
              "Incident 2 | TransitWidget_2_Lines_Prepended_Incident_Text(A, B, Summary 2) | " + generic + " | line A",
              row(1, "A"), "Incident 3 | Summary 3 | no shield | line c"});
  // Rows of the same texts on other lines do not look alike.
  expectRows("Z:1 A:1001 B:1001", 0, summary(2, "ZAB"), {row(1, "Z"), merged(generic, two)});
}

TEST_F(ListBuilder, JoinsNamesAloneWhereAnIncidentHasNoText) {
  using Name = std::optional<std::string>;
  const auto system = [](const Name& name) { return std::make_shared<const TransitSystem>(1, name, nullptr); };
  const struct {
    std::vector<std::pair<Name, TransitSystemRef>> lines;
    std::string text;
  } cases[] = {
      {{{"W", system("S")}, {"W", nullptr}}, "W"},
      {{{"W", nullptr}, {"X", nullptr}}, "TransitWidget_2_Lines_Concatenated(W, X)"},
      {{{"W", nullptr}, {"X", nullptr}, {"Y", nullptr}, {"Z", nullptr}},
       "TransitWidget_N_Lines_Names_Concatenated(W, X, Y, Z)"},
      {{{"W", nullptr}, {"", system("S")}, {{}, system("S")}}, "TransitWidget_2_Lines_Concatenated(W, S)"},
      {{{"", nullptr}, {"W", nullptr}, {{}, system("")}, {"", system({})}}, "W"},
      {{{"", nullptr}, {{}, nullptr}}, ""},
  };
  TransitIncidentFields titleOnly;
  titleOnly.title = "Title";
  Network network("");
  for (const auto& [lines, text] : cases) {
    network.lines.clear();
    for (const auto& [name, itsSystem] : lines) {
      BasicTransitLineItem::Fields fields;
      fields.identifier = std::make_shared<const MapItemIdentifier>(network.lines.size());
      fields.name = name;
      fields.system = itsSystem;
      fields.incidents = {std::make_shared<const BasicTransitIncident>(titleOnly)};
      network.lines.push_back(std::make_shared<const BasicTransitLineItem>(fields));
    }
    EXPECT_EQ(dynamic_cast<const NBTransitItem&>(*build(network)->summaryItem()).secondaryText(), text);
  }
}

TEST_F(ListBuilder, JudgesEachCopyOfAnIncidentByItself) {
  TransitIncidentFields textless;
  textless.muid = 5;
  Network network("");
  network.lines = {lineItem(1, "A", {std::make_shared<const BasicTransitIncident>(textless)}),
                   lineItem(2, "B", {incident(5)}),
                   lineItem(3, "C", {incident(5, dateByAdding(TestPlatform::startDate(), 1))})};
  EXPECT_THAT(network.textsOf(build(network)->expandedItemsOrEmpty()), testing::ElementsAre(row(5, "B"), clearRow(2)));
}

TEST_F(ListBuilder, HandsEveryShownIncidentToTheSummaryAndTheRestToTheOverflowRow) {
  const Network network("A:1,2 B:2,3");
  const auto& a = network.lines[0]->incidents();
  const auto& b = network.lines[1]->incidents();
  const auto list = build(network, 2);
  EXPECT_TRUE(dynamic_cast<const NBTransitSummaryItem&>(*list->summaryItem())
                  .userActivityData()
                  ->isEqual(activityDataForIncidents({a[0], a[1], b[1]}).get()));
  EXPECT_TRUE(list->expandedItems()->at(1)->openable()->isEqual(activityDataForIncidents({a[1], b[1]}).get()));
}

TEST_F(ListBuilder, TellsTheSessionEveryIncidentWithItsFirstLine) {
  session->startSessionIfNeeded();
  const auto list = build(Network("A:1,2 B:2,3"), 1);
  build(Network(""));
  session->recordCloseSessionSwiping();
  const auto& record = platform.analytics.interactions.at(0).record;
  Rows items;
  for (const auto& item : record.incidentItems) items.push_back(item.transitLineMuid + " " + item.transitIncidentTitle);
  EXPECT_THAT(items, testing::ElementsAre("100 Incident 1", "100 Incident 2", "101 Incident 3"));
  EXPECT_EQ(record.transitMessageType, 1);
}

}  // namespace
}  // namespace nimbo
