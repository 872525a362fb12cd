#include "items/NBTransitSummaryItem.h"
#include "platform/artwork/ArtworkCache.h"
#include "support/RecordingPainter.h"
#include "support/TestPlatform.h"
#include "ui/ArtworkCache+Nimbo.h"
#include "ui/DynamicTypeWizard.h"
#include "ui/NBTransitItemFixedHeightCell.h"
#include "ui/NBTransitSummaryCell.h"

namespace nimbo {
namespace {

using testing::Field;

/// The first view inside of a class, in the order of drawing; null when there is none.
template <class T>
T* firstInside(View& view) {
  for (const auto& subview : view.subviews()) {
    if (auto* found = dynamic_cast<T*>(subview.get())) return found;
    if (auto* found = firstInside<T>(*subview)) return found;
  }
  return nullptr;
}

/// A view's frame in the coordinates of the cell that it is in.
Rect frameInCell(const View& view) {
  Rect frame = view.frame();
  for (const View* around = view.superview(); around && !dynamic_cast<const StyledTableCell*>(around);
       around = around->superview()) {
    frame.x += around->frame().x;
    frame.y += around->frame().y;
  }
  return frame;
}

// Metrics of the double at the default text size: the title is 17 points, its lines 17 tall and its capitals 12 (11.9,
// on a pixel); its baseline is 13.6 below its top. The second text is 15 points, its baseline 12 below its top.
class Cells : public testing::Test {
 protected:
  NBTransitItemRef item(std::optional<std::string> title, std::optional<std::string> text, double alpha = 1,
                        bool artworkHidden = false) {
    return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
        std::move(title), std::move(text), NBConfiguredArtwork::initWithArtworkSource_alpha(shield, alpha),
        artworkHidden, nullptr);
  }

  /// As a table does.
  static void layOut(StyledTableCell& row, double width) {
    row.setFrame({0, 0, width, row.frame().height > 0 ? row.frame().height : 5});
    row.setFrame({0, 0, width, row.fittingHeight(5)});
    row.layoutIfNeeded();
  }
  void layOut(double width = 300) { layOut(*cell, width); }

  TestPlatform platform;
  std::shared_ptr<ArtworkCache> cache = memoryConstrainedImageViewCache();
  std::shared_ptr<const SizedTransitArtwork> shield =
      SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(shieldArtwork("M4"), 7, cache);
  std::shared_ptr<NBTransitItemFixedHeightCell> cell =
      NBTransitItemFixedHeightCell::initWithStyle_reuseIdentifier(TableCellStyle::standard, "cell");
  ArtworkImageView& plainShield = *firstInside<ArtworkImageView>(*cell->contentView());
  ArtworkImageView& vibrantShield = *firstInside<ArtworkImageView>(*cell->contentView()->subviews().back());
};

TEST_F(Cells, TextsStandCentredOnCapLineAndLastBaseline) {
  using Text = std::optional<std::string>;
  // From the cap line to the last baseline is in the middle of 110 points, to the nearest pixel.
  for (const auto& [text, width, title, second] :
       {std::tuple{Text("Until Friday"), 300, Rect{0, 37, 227, 17}, Rect{0, 60, 227, 15}},
        {Text(), 300, {0, 47, 227, 17}, {}},
        {Text("Until Friday"), 173, {0, 28, 100, 34}, {0, 68, 100, 15}}}) {
    cell->setTransitItem(item("Tram four late", text));
    cell->setTrailingArtworkColumnWidth(73);
    layOut(width);
    EXPECT_EQ(cell->frame().height, 110);
    EXPECT_EQ(frameInCell(*cell->primaryLabel()), title);
    EXPECT_EQ(cell->secondaryLabel()->isHidden(), !text);
    EXPECT_EQ(text ? frameInCell(*cell->secondaryLabel()) : Rect{}, second);
  }
}

TEST_F(Cells, ShieldEndsTheRowAndTextsEndAtItsColumn) {
  const auto laidOut = [this](const View& view) {
    layOut();
    return frameInCell(view);
  };
  const View& title = *cell->primaryLabel();
  cell->setTransitItem(item("Title", std::nullopt));
  EXPECT_EQ(cell->trailingArtworkColumnWidth(), 0);
  EXPECT_EQ(laidOut(title).width, 300);
  cell->setTrailingArtworkColumnWidth(73);
  EXPECT_EQ(laidOut(title).width, 227);
  EXPECT_EQ(frameInCell(plainShield), (Rect{272, 41, 28, 28}));
  cell->setTransitItem(item("Title", std::nullopt, 1, true));
  EXPECT_EQ(laidOut(title).width, 300);
  EXPECT_TRUE(plainShield.isHidden());
  cell->setTransitItem(item("Title", "Text"));
  EXPECT_EQ(laidOut(title).width, 227);
  EXPECT_FALSE(cell->secondaryLabel()->isHidden());
  // In 40 points the shield keeps 8 from above and below.
  cell->setRowHeight(40);
  EXPECT_EQ(laidOut(plainShield), (Rect{272, 8, 28, 24}));

  platform.strings.rightToLeft = true;
  cell->setRowHeight(110);
  EXPECT_EQ(laidOut(plainShield).x, 0);
  EXPECT_EQ(frameInCell(title).x, 73);
}

TEST_F(Cells, FadedShieldsAreVibrantAndFullOnesAreNot) {
  for (const double alpha : {kDimmedArtworkAlpha, kFullArtworkAlpha, 0.0}) {
    cell->setTransitItem(item("Title", std::nullopt, alpha));
    const ArtworkImageView &shown = alpha < 1 ? vibrantShield : plainShield,
                           &cleared = alpha < 1 ? plainShield : vibrantShield;
    EXPECT_EQ(shown.imageSource(), shield);
    EXPECT_FALSE(shown.isHidden());
    EXPECT_EQ(cleared.imageSource(), nullptr);
    EXPECT_EQ(cleared.alpha(), 1);
    EXPECT_TRUE(cleared.isHidden());
    layOut();
    RecordingPainter painter;
    cell->draw(painter);
    ASSERT_THAT(painter.pictures, testing::SizeIs(1));
    EXPECT_EQ(painter.pictures[0].alpha, alpha);
    EXPECT_EQ(painter.pictures[0].tint.alpha, alpha < 1 ? 1 : 0);
  }
}

TEST_F(Cells, StayInOrderWhateverTheyAreGiven) {
  std::string words;
  for (int i = 0; i < 2000; ++i) words += "word ";
  for (const std::string& text : {std::string(), std::string(10'000, 'x'), words}) {
    for (const double width : {0.0, 1.0, 50.0, 10'000.0}) {
      for (const double height : {0.0, 1.0, 20.0, 110.0, 10'000.0}) {
        SCOPED_TRACE(std::to_string(text.size()) + " in " + std::to_string(width) + "x" + std::to_string(height));
        cell->setTransitItem(item(text, text));
        cell->setTrailingArtworkColumnWidth(73);
        cell->setRowHeight(height);
        layOut(width);
        EXPECT_EQ(cell->frame().height, height);
        const Rect title = frameInCell(*cell->primaryLabel()), second = frameInCell(*cell->secondaryLabel());
        EXPECT_LE(title.y, second.y);
        if (height >= 110) {
          EXPECT_GE(title.y, 0);
          EXPECT_GE(title.height, text.empty() ? 0 : 17);
          EXPECT_GE(second.height, text.empty() ? 0 : 15);
          EXPECT_LE(second.maxY(), height + 3);  // what is below the last baseline may stand out
        }
      }
    }
  }
}

TEST_F(Cells, AMissingImageLeavesItsPlaceEmpty) {
  shield = SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(
      std::make_shared<const TransitArtwork>(TransitArtwork::Fields{}), 7, cache);
  cell->setTransitItem(item("Title", "Text"));
  layOut();
  RecordingPainter painter;
  cell->draw(painter);
  EXPECT_THAT(painter.pictures, testing::IsEmpty());
  EXPECT_TRUE(platform.log.texts("Layout").empty());
}

class SummaryCell : public Cells {
 protected:
  NBTransitSummaryItemRef summary(int shields) {
    TransitArtworks artworks;
    for (int i = 0; i < shields; ++i)
      artworks.push_back(i % 2 ? modeArtwork(TransitMode::bus) : shieldArtwork("L" + std::to_string(i % 10)));
    return NBTransitSummaryItem::initWithText_artworks_userActivityData("4 advisories", artworks, nullptr);
  }
  SummaryCell() {
    platform.strings.texts["Transit_Incident_Not_Displayed_Incidents"] = "+";
    summaryCell->setArtworkCache(cache);
  }
  std::shared_ptr<NBTransitSummaryCell> summaryCell =
      NBTransitSummaryCell::initWithStyle_reuseIdentifier(TableCellStyle::standard, "summary");
};

TEST_F(SummaryCell, CountsTheShieldsThatDoNotFit) {
  TransitInfoLabelView& shields = *summaryCell->artworksLabel();
  for (const auto& [count, width, shown, text] :
       {std::tuple{3, 200.0, 3u, ""}, {30, 359.0, 9u, "+(21)"}, {7, 200.0, 5u, "+(2)"}, {30, 10.0, 0u, "+(30)"}}) {
    SCOPED_TRACE(std::to_string(count) + " in " + std::to_string(width));
    summaryCell->setItem(summary(count));
    layOut(*summaryCell, width);
    EXPECT_EQ(summaryCell->frame().height, 110);
    RecordingPainter painter;
    summaryCell->draw(painter);
    EXPECT_THAT(painter.pictures, testing::SizeIs(shown));
    EXPECT_EQ(painter.texts.back().text, *text ? text : "4 advisories");
    // The cap line of the text and the bottom of the shields are as far from the edges, to a pixel.
    EXPECT_EQ(frameInCell(*summaryCell->primaryLabel()), (Rect{0, 26, width, 17}));
    EXPECT_EQ(frameInCell(shields), (Rect{0, 55, width, 28}));
  }
}

TEST_F(SummaryCell, TextsHaveTheWeightsAndColoursOfTheirRoles) {
  for (const Appearance appearance : {Appearance::light, Appearance::dark}) {
    Environment::current().setAppearance(appearance);
    cell->setTransitItem(item("Title", "Second"));
    summaryCell->setItem(summary(30));
    layOut();
    layOut(*summaryCell, 200);
    RecordingPainter painter;
    cell->draw(painter);
    summaryCell->draw(painter);
    const auto isText = [](const char* text, double size, bool bold, Color color) {
      using Text = RecordingPainter::Text;
      return testing::AllOf(Field(&Text::text, text), Field(&Text::font, FontDescriptor{size, bold}),
                            Field(&Text::color, color));
    };
    const Color primary = VisualEffect(101).color(appearance), secondary = VisualEffect(102).color(appearance);
    EXPECT_THAT(painter.texts,
                testing::ElementsAre(isText("Title", 17, true, primary), isText("Second", 15, false, secondary),
                                     isText("4 advisories", 17, false, primary),
                                     isText("+(26)", 17, false, colorOf(SystemColor::systemGrey, appearance))));
    EXPECT_THAT(painter.pictures,
                testing::Each(Field(&RecordingPainter::Picture::isForNight, appearance == Appearance::dark)));
  }
  EXPECT_THAT(cell->layoutDump(), testing::HasSubstr("primaryLabel.firstBaseline = contentGuide.top + 12 @750"));
}

TEST_F(SummaryCell, HidesShieldsThatAreNotThere) {
  summaryCell->setItem(summary(0));
  layOut(*summaryCell, 300);
  EXPECT_TRUE(summaryCell->artworksLabel()->isHidden());
  EXPECT_EQ(frameInCell(*summaryCell->primaryLabel()), (Rect{0, 46, 300, 17}));
  summaryCell->setItem(summary(2));
  layOut(*summaryCell, 300);
  EXPECT_FALSE(summaryCell->artworksLabel()->isHidden());
  summaryCell->setItem(nullptr);
  EXPECT_TRUE(summaryCell->artworksLabel()->isHidden());
  EXPECT_EQ(summaryCell->primaryLabel()->text(), std::nullopt);
}

TEST_F(SummaryCell, FollowsTheTextSize) {
  summaryCell->setItem(summary(3));
  cell->setTransitItem(item("Title", "Text"));
  layOut(*summaryCell, 300);
  layOut();
  const auto& lastOperations = DynamicTypeWizard::_singletonInstance()->objectToSelectorStringTables().at(1);
  EXPECT_TRUE(lastOperations.objectForKey(cell.get()) && lastOperations.objectForKey(summaryCell.get()));
  Environment::current().setContentSizeCategory(ContentSizeCategory::accessibilityMedium);
  layOut(*summaryCell, 300);
  layOut();
  EXPECT_EQ(summaryCell->primaryLabel()->frame().height, 28);
  EXPECT_EQ(summaryCell->artworksLabel()->font()->descriptor().pointSize, 17);  // keeps the size it was made with
  // 21 points between baselines at the default size are 35 now.
  const Rect title = frameInCell(*cell->primaryLabel()), second = frameInCell(*cell->secondaryLabel());
  EXPECT_NEAR((second.y + 0.8 * 25) - (title.y + 0.8 * 28), 35, 1);
  EXPECT_NEAR(title.y + 0.8 * 28 - 20 + second.y + 20, 110, 2);
}

}  // namespace
}  // namespace nimbo
