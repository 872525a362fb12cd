#include "platform/ui/StyledTableCell.h"
#include "platform/ui/View.h"
#include "support/RecordingPainter.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

/// Fills its bounds, counts its layouts, and asks for as many more as it is told.
class CountingView final : public View {
 public:
  void layoutSubviews() override {
    ++layouts;
    if (more-- > 0) setNeedsLayout();
    View::layoutSubviews();
  }
  void drawContent(Painter& painter, const DrawingContext&) override { painter.fillRect(bounds(), {}); }
  int layouts = 0, more = 0;
};

class Views : public testing::Test {
 protected:
  static std::shared_ptr<CountingView> viewIn(View& parent, const Rect& frame = {}) {
    auto view = std::make_shared<CountingView>();
    view->setFrame(frame);
    parent.addSubview(view);
    return view;
  }
  TestPlatform platform;
  std::shared_ptr<CountingView> root = std::make_shared<CountingView>();
};

TEST_F(Views, KeepTheConstraintsInsideWhenTheyMoveAndLoseThoseAcross) {
  const auto box = viewIn(*root), inner = viewIn(*box);
  for (const auto& view : {box, inner}) view->setUsesAutomaticConstraints(false);
  const auto inside = inner->widthAnchor().constraintEqualToAnchor(box->widthAnchor());
  const auto across = inner->widthAnchor().constraintEqualToAnchor(root->widthAnchor());
  LayoutConstraint::activateConstraints({inside, across});
  root->setFrame({0, 0, 200, 100});
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame().width, 200);
  box->removeFromSuperview();
  EXPECT_FALSE(across->isActive());
  box->setFrame({0, 0, 90, 10});
  box->layoutIfNeeded();
  EXPECT_EQ(inner->frame().width, 90);
  const auto other = viewIn(*root);
  other->addSubview(box);
  box->widthAnchor().constraintEqualToConstant(70)->setActive(true);
  root->layoutIfNeeded();
  EXPECT_EQ(inner->frame().width, 70);
}

TEST_F(Views, AreLaidOutWhenTheyAskAndOnlyThen) {
  const auto a = viewIn(*root), b = viewIn(*a);
  const auto expectLayouts = [&](int ofRoot, int ofA, int ofB) {
    root->layoutIfNeeded();
    EXPECT_THAT((std::array{root->layouts, a->layouts, b->layouts}), testing::ElementsAre(ofRoot, ofA, ofB));
  };
  expectLayouts(1, 1, 1);
  expectLayouts(1, 1, 1);
  b->setNeedsLayout();
  expectLayouts(1, 1, 2);
  a->setFrame({3, 4, 0, 0});
  expectLayouts(1, 1, 2);
  a->setFrame({3, 4, 5, -6});
  EXPECT_EQ(a->frame(), (Rect{3, 4, 5, 0}));
  expectLayouts(1, 2, 2);
  for (int i = 0; i < 2; ++i) a->setLayoutMargins({1, 2, 3, 1});
  expectLayouts(1, 3, 2);
  a->setFrame({3, 4, 5, 10});
  EXPECT_EQ(a->layoutMarginsFrame(), (Rect{2, 1, 2, 6}));
  a->setHidden(true);
  expectLayouts(2, 4, 2);
  a->setHidden(true);
  expectLayouts(2, 4, 2);
  Environment::current().setScreenScale(2);
  expectLayouts(3, 5, 3);
  b->more = 99;
  b->setNeedsLayout();
  expectLayouts(3, 5, 7);
}

TEST_F(Views, AreDrawnOnDevicePixelsUnlessThereIsNothingToSee) {
  Environment::current().setScreenScale(2);
  const auto shown = viewIn(*root, {1.3, 2.6, 10, 20}), inner = viewIn(*shown, {1.4, 0, 1, 1});
  viewIn(*root, {0, 0, 0, 5});
  viewIn(*root, {0, 0, 5, 0});
  viewIn(*root, {0, 0, 5, 5})->setHidden(true);
  const auto cell = std::make_shared<StyledTableCell>(TableCellStyle::standard, "cell");
  cell->setFrame({0, 0, 30, 40});
  root->addSubview(cell);
  viewIn(*root, {5, 6, 7, 8});
  RecordingPainter painter;
  root->draw(painter);
  ASSERT_THAT(painter.fills, testing::SizeIs(4));
  EXPECT_EQ(painter.fills[3].rect, (Rect{5, 6, 7, 8}));
  EXPECT_EQ(painter.fills[1].rect, (Rect{1.5, 2.5, 10, 20}));
  EXPECT_EQ(painter.fills[2].rect, (Rect{3, 2.5, 1, 1}));
  EXPECT_GT(painter.clips.at(0).maxX(), 1e5);
  EXPECT_EQ(painter.clips.at(2), (Rect{0, 0, 30, 40}));
  EXPECT_EQ(roundToViewScale(0.7, nullptr), 0.5);
}

}  // namespace
}  // namespace nimbo
