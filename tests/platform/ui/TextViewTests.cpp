#include "platform/ui/Color.h"
#include "platform/ui/Environment.h"
#include "platform/ui/Font.h"
#include "platform/ui/TransitInfoLabelView.h"
#include "platform/ui/VisualEffectView.h"
#include "support/RecordingPainter.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

TEST(SystemColors, AreThoseOfThePalette) {
  using enum SystemColor;
  for (const auto& [color, light, dark] : {std::tuple{background, "f6f6f8", "1e1e20"},
                                           {label, "000000", "ffffff"},
                                           {systemGrey, "606066", "a6a6ac"},
                                           {rowHighlight, "e2e2e6", "343438"}}) {
    EXPECT_EQ(colorOf(color, Appearance::light), colorFromHexText(light));
    EXPECT_EQ(colorOf(color, Appearance::dark), colorFromHexText(dark));
  }
  for (const auto& [style, light, dark] :
       {std::tuple{101, "141414", "fafafa"}, {102, "565656", "b4b4b4"}, {103, "c8c8c8", "4a4a4a"}}) {
    EXPECT_EQ(VisualEffect(style).color(Appearance::light), colorFromHexText(light));
    EXPECT_EQ(VisualEffect(style).color(Appearance::dark), colorFromHexText(dark));
  }
}

TEST(Color, IsReadOfSixHexDigitsAlone) {
  for (const char* text : {"", "12345", "12345g", "g12345", "##12345", "1234567"})
    EXPECT_EQ(colorFromHexText(text), std::nullopt) << text;
}

TEST(Font, HasTheSizeOfItsStyleAtEachTextSize) {
  const TestPlatform platform;
  constexpr double kBody[] = {14, 15, 16, 17, 19, 21, 23, 28, 33, 40, 47, 53};
  constexpr double kSubheadline[] = {12, 13, 14, 15, 17, 19, 21, 25, 30, 36, 42, 49};
  for (std::size_t size = 0; size < std::size(kBody); ++size) {
    const auto category = static_cast<ContentSizeCategory>(size);
    Environment::current().setContentSizeCategory(category);
    const auto font = Font::preferredFont(TextStyle::subheadline);
    const auto bold = Font::preferredFont(TextStyle::body, FontTraits::bold);
    EXPECT_EQ(font->descriptor(), (FontDescriptor{kSubheadline[size], false}));
    EXPECT_EQ(bold->descriptor(), (FontDescriptor{kBody[size], true}));
    EXPECT_DOUBLE_EQ(font->_scaledValueForValue(15), kSubheadline[size]);
    EXPECT_TRUE(font->isEqual(Font::preferredFont(TextStyle::subheadline).get()));
    EXPECT_FALSE(bold->isEqual(Font::preferredFont(TextStyle::body).get()));
  }
}

class TransitInfoLabel : public testing::Test {
 protected:
  TransitInfoLabel() {
    // Shields of 28 points in a row, 5 apart: n of them end at 33 n - 5. The text takes 8.5 points a character.
    for (int i = 0; i < 10; ++i) shields.push_back(shieldArtwork("L" + std::to_string(i)));
    label->setUsesAutomaticConstraints(false);
    label->setSpaceBetweenShields(5);
    label->setArtworkCache(cache);
    root->addSubview(label);
    LayoutConstraint::activateConstraints({label->leadingAnchor().constraintEqualToAnchor(root->leadingAnchor()),
                                           label->topAnchor().constraintEqualToAnchor(root->topAnchor())});
  }
  void setMaxWidth(double width) {
    label->setMaxWidth_truncationTextGenerator(width, [](std::uint64_t count) { return "+" + std::to_string(count); });
  }

  TestPlatform platform;
  std::shared_ptr<ArtworkCache> cache =
      ArtworkCache::initWithArtworkManager(TransitArtworkManager::initWithIconManager(platform.shieldRenderer));
  std::vector<TransitArtworkRef> shields;
  std::shared_ptr<View> root = std::make_shared<View>();
  std::shared_ptr<TransitInfoLabelView> label = std::make_shared<TransitInfoLabelView>();
};

TEST_F(TransitInfoLabel, KeepsAsManyShieldsAsFitWithTheirCount) {
  for (const auto& [count, width, shown, text] : {std::tuple{3, 94, 3u, ""},
                                                  {3, 93, 2u, "+1"},
                                                  {3, 82, 1u, "+2"},
                                                  {10, 325, 10u, ""},
                                                  {10, 40, 0u, "+10"},
                                                  {1, 10, 0u, "+1"},
                                                  {1, 0, 0u, ""},
                                                  {0, 50, 0u, ""}}) {
    label->setLabelItems({shields.begin(), shields.begin() + count});
    setMaxWidth(width);
    root->layoutIfNeeded();
    EXPECT_LE(label->frame().width, width);
    RecordingPainter painter;
    root->draw(painter);
    EXPECT_THAT(painter.pictures, testing::SizeIs(shown)) << count << " in " << width;
    EXPECT_EQ(painter.texts.empty() ? "" : painter.texts[0].text, text) << count << " in " << width;
  }
}

TEST_F(TransitInfoLabel, DrawsShieldsOnTheMiddleOfItsCapitals) {
  shields = {shieldArtwork("A"), std::make_shared<const TransitArtwork>(TransitArtwork::Fields{}),
             modeArtwork(TransitMode::bus), shieldArtwork("B"), shieldArtwork("C")};
  label->setIconSize(0);
  label->setLabelItems(shields);
  setMaxWidth(105);
  for (const bool mirrored : {false, true}) {
    const Appearance appearance = mirrored ? Appearance::dark : Appearance::light;
    Environment::current().setAppearance(appearance);
    platform.strings.rightToLeft = mirrored;
    root->setFrame({0, 0, 120, 60});
    label->setNeedsUpdateConstraints();
    root->layoutIfNeeded();
    // 28, a symbol of 14, 28, and the count of one in 17; what cannot be drawn takes no room.
    EXPECT_EQ(label->frame(), (Rect{mirrored ? 18.0 : 0.0, 0, 102, 28}));
    RecordingPainter painter;
    root->draw(painter);
    ASSERT_THAT(painter.pictures, testing::SizeIs(3));
    EXPECT_EQ(painter.pictures[0].alpha, 1);
    EXPECT_EQ(painter.pictures[0].rect, (Rect{mirrored ? 92.0 : 0.0, 0, 28, 28}));
    EXPECT_EQ(painter.pictures[1].rect, (Rect{mirrored ? 73.0 : 33.0, 7, 14, 14}));
    ASSERT_THAT(painter.texts, testing::SizeIs(1));
    EXPECT_NEAR(painter.texts[0].origin.y, 14 + 0.35 * 17 - 0.8 * 17, 1e-9);
    EXPECT_EQ(painter.texts[0].color, colorOf(SystemColor::systemGrey, appearance));
  }
}

TEST_F(TransitInfoLabel, MeasuresAnewWhateverIsChanged) {
  root->setFrame({0, 0, 400, 100});
  label->setLabelItems({shields[0], modeArtwork(TransitMode::bus), shields[1]});
  const auto marker = std::make_shared<View>();
  marker->setUsesAutomaticConstraints(false);
  root->addSubview(marker);
  LayoutConstraint::activateConstraints({marker->topAnchor().constraintEqualToAnchor(label->firstBaselineAnchor()),
                                         marker->bottomAnchor().constraintEqualToAnchor(label->bottomAnchor())});
  const auto expectMeasured = [&](Size size, double baseline) {
    root->layoutIfNeeded();
    EXPECT_EQ(label->frame().size(), size);
    EXPECT_NEAR(marker->frame().y, baseline, 0.5);
  };
  expectMeasured({94, 28}, 20);
  label->setSpaceBetweenShields(1);
  expectMeasured({86, 28}, 20);
  label->setIconSize(0);
  expectMeasured({72, 28}, 20);
  label->setShieldSize(1);
  expectMeasured({48, 18}, 14);
  Environment::current().setScreenScale(2);
  expectMeasured({48, 17.5}, 14);
  label->setFont(std::make_shared<const Font>(FontDescriptor{50, false}, 1));
  expectMeasured({48, 50}, 40);
  setMaxWidth(47);
  expectMeasured({25, 50}, 40);  // "+3", cut off
  label->setLabelItems({shields[0]});
  expectMeasured({16, 50}, 40);
  label->setArtworkCache(nullptr);
  expectMeasured({0, 50}, 40);
}

}  // namespace
}  // namespace nimbo
