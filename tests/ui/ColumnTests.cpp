#include "platform/artwork/ArtworkImageSource.h"
#include "support/TestPlatform.h"
#include "ui/ArtworkCache+Nimbo.h"
#include "ui/NBTransitItemArtworkColumnCalculator.h"

namespace nimbo {
namespace {

/// Shields whose text says how wide they are at size 7; each step smaller takes 20 points away.
class Column : public testing::Test {
 protected:
  Column() {
    platform.shieldRenderer->width = [](std::int64_t size, const std::string& text) {
      return std::stod(text) - 20.0 * static_cast<double>(7 - size);
    };
  }

  SizedTransitArtworkRef shield(const std::string& widthText) {
    return SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(shieldArtwork(widthText), 7, cache);
  }
  std::vector<SizedTransitArtworkRef> shieldsOf(const std::vector<std::string>& widths) {
    std::vector<SizedTransitArtworkRef> shields;
    for (const auto& text : widths) shields.push_back(shield(text));
    return shields;
  }
  static NBTransitItemRef item(ArtworkImageSourceRef source, const std::string& text = "row") {
    return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
        text, {}, NBConfiguredArtwork::initWithArtworkSource_alpha(std::move(source), 1), false, nullptr);
  }
  static std::int64_t sizeIn(const NBTransitItemRef& row) {
    return dynamic_cast<const SizedTransitArtwork&>(*row->artwork()->artworkSource()).shieldSize();
  }
  NBTransitItems fit(const NBTransitItems& items, const ArtworkWidthCalculatorSizeParameter& parameter) {
    return calculator.itemsFromItems_sizeParameter_outArtworkColumnWidth_downSizingBlock(
        items, parameter, &width, [this](const NBTransitItemRef& row, const SizedTransitArtworkRef& smaller) {
          ++downSized;
          return keepsRows ? nullptr : item(smaller, *row->primaryText());
        });
  }

  TestPlatform platform;
  std::shared_ptr<ArtworkCache> cache = memoryConstrainedImageViewCache();
  NBTransitItemArtworkColumnCalculator calculator;
  double width = 0;
  int downSized = 0;
  bool keepsRows = false;
};

TEST_F(Column, ShrinksTheWidestUntilItFits) {
  struct Case {
    std::vector<std::string> shields;
    Insets insets;
    double width;
    std::vector<std::pair<std::string, std::int64_t>> sizes;  // of those that shrank
  };
  for (const Case& c : {Case{{}, {}, 73, {}},
                        {{"20", "40", "60"}, {}, 73, {}},
                        {{"20", "100"}, {9, 4, 9, 6}, 110, {}},
                        {{"186"}, {}, 186, {}},
                        {{"200", "210", "90"}, {}, 180, {{"200", 6}, {"210", 5}}},
                        {{"400", "90"}, {}, 90, {{"400", 0}}},
                        {{"200", "200"}, {}, 180, {{"200", 6}}}}) {
    double columnWidth = 0;
    const auto replacements = TransitDirectionsListArtworkWidthCalculator::initWithSizedArtworks_sizeParameter(
                                  shieldsOf(c.shields), {73, 186, c.insets})
                                  ->calculateArtworkViewWidthAndArtworkSizes(&columnWidth);
    EXPECT_EQ(columnWidth, c.width) << testing::PrintToString(c.shields);
    std::vector<std::pair<std::string, std::int64_t>> sizes;
    for (const auto& [given, smaller] : replacements)
      sizes.emplace_back(*given->artwork()->shieldDataSource()->shieldText, smaller->shieldSize());
    EXPECT_THAT(sizes, testing::UnorderedElementsAreArray(c.sizes));
  }
  EXPECT_FALSE(platform.shieldRenderer->cachesIconAtlases);
}

TEST_F(Column, PutsABudgetRightThatMakesNoSense) {
  using Parameter = ArtworkWidthCalculatorSizeParameter;
  for (const auto& [given, used] : {std::pair{Parameter{-1, 30, {}}, Parameter{50, 50, {}}},
                                    {{0, -5, {}}, {0, 0, {}}},
                                    {{73, 60, {}}, {73, 73, {}}}})
    EXPECT_EQ(TransitDirectionsListArtworkWidthCalculator({}, given).sizeParameter(), used);
}

TEST_F(Column, ReplacesTheRowOfAShrunkShieldAndNoOther) {
  const auto symbol = item(NamedImage::imageNamed("advisories-v2")), bare = item(nullptr);
  const auto none = NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable("row", {}, nullptr,
                                                                                                    true, nullptr);
  const NBTransitItems rows = {
      symbol, item(shield("200"), "first"), bare, item(shield("90")), item(shield("200"), "second"), none};
  const NBTransitItems fitted = fit(rows, {73, 186, {}});
  EXPECT_EQ(width, 180);
  ASSERT_EQ(fitted.size(), rows.size());
  for (const std::size_t unchanged : {0u, 1u, 2u, 3u, 5u}) EXPECT_EQ(fitted[unchanged], rows[unchanged]);
  // Of two rows with equal shields, the later one.
  EXPECT_EQ(sizeIn(fitted[4]), 6);
  EXPECT_EQ(fitted[4]->primaryText(), "second");
  keepsRows = true;
  EXPECT_EQ(fit(rows, {73, 185, {}}), rows);
}

TEST_F(Column, DrawsAShieldOnceInEachColorOfItsText) {
  for (const auto shieldOf :
       {&TransitArtwork::Fields::shieldDataSource, &TransitArtwork::Fields::iconFallbackShieldDataSource}) {
    const auto draw = [&](std::optional<std::string> textColor) {
      TransitArtwork::Fields fields = shieldArtwork("90")->fields();
      fields.*shieldOf = TransitShield{0, "90", "#336699", std::move(textColor)};
      return cache->imageForArtwork(std::make_shared<const TransitArtwork>(fields), 7, 1, false);
    };
    const ImageRef white = draw("#ffffff"), yellow = draw("#ffff00"), automatic = draw({});
    EXPECT_NE(white, yellow);
    EXPECT_NE(white, automatic);
    EXPECT_EQ(draw("#ffffff"), white);
  }
}

TEST_F(Column, AnswersTheSameQuestionFromMemory) {
  const auto question = [this](const std::string& shieldWidth) { return NBTransitItems{item(shield(shieldWidth))}; };
  const ArtworkWidthCalculatorSizeParameter parameter{73, 186, {1, 2, 3, 4}};
  const NBTransitItems first = fit(question("200"), parameter);
  EXPECT_EQ(downSized, 1);
  width = 0;
  EXPECT_EQ(fit(question("200"), parameter), first);
  EXPECT_EQ(width, 186);
  EXPECT_EQ(downSized, 1);
  auto changed = parameter;
  for (double* number : {&changed.defaultArtworkViewWidth, &changed.maxArtworkViewWidth, &changed.artworkInsets.top,
                         &changed.artworkInsets.left, &changed.artworkInsets.bottom, &changed.artworkInsets.right}) {
    *number -= 1;
    const int before = downSized;
    fit(question("200"), changed);
    EXPECT_EQ(downSized, before + 1);
  }
  fit(question("201"), changed);
  EXPECT_EQ(downSized, 8);
}

}  // namespace
}  // namespace nimbo
