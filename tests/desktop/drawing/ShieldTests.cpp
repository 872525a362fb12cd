#include <algorithm>

#include "desktop/drawing/CairoShieldRenderer.h"
#include "desktop/drawing/Ink.h"
#include "desktop/drawing/PangoTextSystem.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

TransitShield shieldOf(ShieldType type, const char* text, const char* color = "#be1e2d",
                       const char* textColor = "#ffffff") {
  TransitShield shield{static_cast<std::int64_t>(type), {}, {}, {}};
  if (text) shield.shieldText = text;
  if (color) shield.shieldColorString = color;
  if (textColor) shield.shieldTextColorString = textColor;
  return shield;
}

TransitArtwork::Fields fieldsOf(const TransitShield& shield) {
  TransitArtwork::Fields fields;
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::shield);
  fields.shieldDataSource = shield;
  return fields;
}

TransitArtwork::Fields fieldsOf(std::int64_t iconType, std::int64_t mode) {
  TransitArtwork::Fields fields;
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::icon);
  fields.iconDataSource = TransitIcon{iconType, 0, mode, 0, 0};
  return fields;
}

class Shields : public testing::Test {
 protected:
  ImageRef render(const TransitArtwork::Fields& fields, std::int64_t size = 7, double scale = 2, bool night = false) {
    return renderer.render(TransitArtwork(fields), size, scale, night);
  }
  ImageRef render(const TransitShield& shield, std::int64_t size = 7) { return render(fieldsOf(shield), size); }

  TestPlatform platform;
  PangoTextSystem text;
  CairoShieldRenderer renderer{text};
};

TEST_F(Shields, ShrinkWithEachSizeAndFitTheirColumn) {
  const char* texts[] = {"1",          "42",         "SIR",
                         "京王線",     "90А",        "Red Line",
                         "MetroRide",  "S-Bahn 41",  "東京メトロ銀座線",
                         "WWWWWWWWWW", "Hudson-Be…", "Providence/Stoughton Line"};
  constexpr double kNarrowestColumn = 73, kGap = 4;
  for (const bool hasBadge : {false, true})
    for (const auto type : {ShieldType::roundedBox, ShieldType::circle, ShieldType::pill})
      for (const char* name : texts) {
        Size larger{1000, 31};
        for (std::int64_t size = 7; size >= 0; --size) {
          auto fields = fieldsOf(shieldOf(type, name));
          fields.hasRoutingIncidentBadge = hasBadge;
          const Size now = render(fields, size)->size();
          EXPECT_LT(now.height, larger.height) << name << size;
          EXPECT_LT(now.width, larger.width) << name << size;
          EXPECT_GE(now.width, now.height) << name << size;
          EXPECT_LE(now.width, kNarrowestColumn - kGap) << name << size;
          larger = now;
        }
      }
  EXPECT_EQ(render(shieldOf(ShieldType::pill, "1"), -3)->size(), render(shieldOf(ShieldType::pill, "1"), 0)->size());
  EXPECT_EQ(render(shieldOf(ShieldType::pill, "1"), 99)->size(), render(shieldOf(ShieldType::pill, "1"), 7)->size());
}

TEST_F(Shields, KeepTheTextInsideTheShape) {
  for (const auto type : {ShieldType::roundedBox, ShieldType::circle, ShieldType::pill})
    for (const char* name : {"W", "10", "Q65", "SIR", "Fitchburg Line Shuttle"})
      for (const std::int64_t size : {0, 7}) {
        const Ink ink(render(shieldOf(type, name), size));
        const auto shape = ink.drawn(), letters = ink.find([](std::uint32_t p) { return (p & 0xff) > 0x90; });
        EXPECT_EQ(shape.left, 0);
        EXPECT_EQ(shape.right, ink.width());
        EXPECT_GT(letters.count, 10u) << name;
        // Evenly spaced from both sides, and clear of the edge.
        EXPECT_GE(letters.left, 3) << name << size;
        EXPECT_NEAR(letters.left, ink.width() - letters.right, 7) << name << size;
        EXPECT_NEAR(letters.top, ink.height() - letters.bottom, 6) << name << size;
      }
}

TEST_F(Shields, KeepTheirTextLegible) {
  // The agency's colour where it contrasts, else black or white, whichever contrasts more.
  for (const auto& [color, textColor, expected] : {std::tuple{"#000000", "#ffff00", 0xffff00u},
                                                   {"#fccc0a", "#ffffff", 0x000000u},
                                                   {"fccc0a", nullptr, 0x000000u},
                                                   {"#0039A6", "#000000", 0xffffffu},
                                                   {"#0039a6", "blue", 0xffffffu},
                                                   {"#0039a6", " ", 0xffffffu}}) {
    const Ink ink(render(shieldOf(ShieldType::roundedBox, "HH", color, textColor)));
    EXPECT_GT(ink.ofColor(expected).count, 50u) << color;
  }
  for (const bool night : {false, true})
    for (const char* color : {"#777777", "#7c878e", "#ff6319", static_cast<const char*>(nullptr)}) {
      const ShieldColors colors = shieldColors(shieldOf(ShieldType::pill, "1", color, "#808080"), night);
      EXPECT_GE(contrastRatio(colors.fill, colors.text), 4.5) << night;
    }
}

TEST_F(Shields, StandOutFromTheRow) {
  const auto hasOutline = [](const char* color, bool night) {
    return shieldColors(shieldOf(ShieldType::pill, "1", color), night).outline.alpha > 0;
  };
  EXPECT_TRUE(hasOutline("#ffffff", false));
  EXPECT_TRUE(hasOutline("#000000", true));
  EXPECT_FALSE(hasOutline("#ffffff", true));
  EXPECT_FALSE(hasOutline("#000000", false));
  EXPECT_FALSE(hasOutline("#fccc0a", false));
  const Ink white(render(shieldOf(ShieldType::roundedBox, "1", "#ffffff")));
  EXPECT_GT(white.find([](std::uint32_t p) { return p >> 24 == 255 && (p & 0xff) < 190; }).count,
            white.ofColor(0).count + 100);
}

TEST_F(Shields, DrawAModeAsItsOwnSymbol) {
  std::vector<std::size_t> counts;
  for (std::int64_t mode = 0; mode <= 10; ++mode) {
    const auto image = render(fieldsOf(1, mode));
    ASSERT_TRUE(image) << mode;
    EXPECT_EQ(image->size(), (Size{30, 30}));
    counts.push_back(Ink(image).ofColor(0xffffff).count);
    EXPECT_GT(counts.back(), 200u) << mode;
  }
  std::sort(counts.begin(), counts.end());
  EXPECT_EQ(std::adjacent_find(counts.begin(), counts.end()), counts.end());
  EXPECT_TRUE(platform.log.lines().empty());
}

TEST_F(Shields, FallBackWhereAnIconIsUnknown) {
  auto fields = fieldsOf(5, 3);
  EXPECT_EQ(Ink(render(fields)).drawn().count, Ink(render(fieldsOf(1, 0))).drawn().count);
  fields.iconFallbackShieldDataSource = shieldOf(ShieldType::roundedBox, "Ferry 12");
  EXPECT_GT(render(fields)->size().width, 50);
  fields.iconDataSource->iconType = 1;
  EXPECT_EQ(render(fields)->size().width, 30);
  fields.iconDataSource->defaultTransitType = 4711;
  EXPECT_GT(render(fields)->size().width, 50);
}

TEST_F(Shields, DrawTextsAndNothing) {
  TransitArtwork::Fields fields;
  EXPECT_FALSE(render(fields));
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::text);
  EXPECT_FALSE(render(fields));
  fields.textDataSource =
      TransitArtworkText{ServerFormattedString{{{"{n} lines", "more"}}, {{" + "}}, {{{"n", "12"}}}, "x"}};
  const auto composed = render(fields);
  fields.textDataSource = TransitArtworkText{ServerFormattedString{{}, {}, {}, "12 lines + more"}};
  EXPECT_EQ(render(fields)->size(), composed->size());
  EXPECT_FALSE(render(shieldOf(ShieldType::pill, " \t", nullptr)));
  EXPECT_TRUE(render(shieldOf(ShieldType::pill, nullptr, "#00ff00")));
  EXPECT_FALSE(render(fieldsOf(shieldOf(ShieldType::pill, "1")), 7, 5000)) << "too large";
  EXPECT_EQ(platform.log.texts("Images", LogLevel::error).size(), 1u);
}

}  // namespace
}  // namespace nimbo
