#include <cmath>
#include <limits>

#include "platform/ui/Environment.h"
#include "platform/ui/StackView.h"
#include "platform/ui/StyledLabel.h"
#include "platform/ui/TransitInfoLabelView.h"
#include "support/RecordingPainter.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using testing::HasSubstr;
using testing::SizeIs;

std::shared_ptr<View> constrainedView(View& parent, const std::string& name) {
  auto view = std::make_shared<View>();
  view->setLayoutName(name);
  view->setUsesAutomaticConstraints(false);
  parent.addSubview(view);
  return view;
}

/// A label of one word a line at 17 points: 8.5 points a character, 17 a line.
std::shared_ptr<StyledLabel> label(const std::string& text, std::size_t lines = 1) {
  auto view = std::make_shared<StyledLabel>();
  view->setNumberOfLines(lines);
  view->setText(text);
  return view;
}

void activate(const std::vector<LayoutConstraintRef>& constraints) {
  LayoutConstraint::activateConstraints(constraints);
}

class Layout : public testing::Test {
 protected:
  Layout() { root->setFrame({0, 0, 200, 100}); }

  /// Pins a view to the root's leading top corner.
  void pinToCorner(View& view) {
    activate({view.leadingAnchor().constraintEqualToAnchor(root->leadingAnchor()),
              view.topAnchor().constraintEqualToAnchor(root->topAnchor())});
  }

  Rect laidOut(const View& view) {
    root->layoutIfNeeded();
    return view.frame();
  }

  TestPlatform platform;
  std::shared_ptr<View> root = std::make_shared<View>();
};

TEST_F(Layout, FollowsConstantsPrioritiesAndActiveFlags) {
  const auto box = constrainedView(*root, "box");
  pinToCorner(*box);
  const auto narrow = box->widthAnchor().constraintEqualToConstant(30);
  const auto wide = box->widthAnchor().constraintEqualToConstant(90);
  wide->setPriority(400);
  activate({narrow, wide, box->bottomAnchor().constraintEqualToAnchor(root->bottomAnchor(), -20)});
  EXPECT_EQ(laidOut(*box), (Rect{0, 0, 30, 80}));
  narrow->setConstant(40);
  EXPECT_EQ(laidOut(*box).width, 40);
  narrow->setPriority(399);
  EXPECT_EQ(laidOut(*box).width, 90);
  wide->setActive(false);
  box->layoutIfNeeded();
  EXPECT_EQ(box->frame().width, 40);
  root->setFrame({0, 0, 200, 60});
  EXPECT_EQ(laidOut(*box), (Rect{0, 0, 40, 40}));
  const auto half = constrainedView(*box, "half");
  activate({half->bottomAnchor().constraintEqualToAnchor(half->centerYAnchor(), 9),
            half->trailingAnchor().constraintEqualToAnchor(root->trailingAnchor(), -50),
            half->leadingAnchor().constraintEqualToAnchor(box->leadingAnchor())});
  for (const double width : {100, 110}) {
    root->setFrame({0, 0, width, 60});
    EXPECT_EQ(laidOut(*half).size(), (Size{width - 50, 18}));
  }
  EXPECT_TRUE(platform.log.lines().empty());
}

TEST_F(Layout, LogsAContradictionOnceAndLeavesTheBoundOutWhileItLasts) {
  const auto box = constrainedView(*root, "box");
  pinToCorner(*box);
  const auto height = box->heightAnchor().constraintEqualToConstant(10);
  const auto minimum = box->heightAnchor().constraintGreaterThanOrEqualToConstant(40);
  minimum->setIdentifier("room for a finger");
  activate({minimum, height});
  for (int i = 0; i < 3; ++i) {
    root->layoutIfNeeded();
    root->setNeedsUpdateConstraints();
  }
  EXPECT_EQ(box->frame().height, 10);
  ASSERT_THAT(platform.log.lines(), SizeIs(1));
  EXPECT_THAT(platform.log.lines()[0].text, HasSubstr("\"room for a finger: box.height >= 40\" is left out"));
  EXPECT_THAT(platform.log.lines()[0].text, HasSubstr("box.height = 10"));
  EXPECT_THAT(box->layoutDump(), HasSubstr("box.height = 10 + dummy(box.height = 10)"));
  EXPECT_THAT(box->layoutDump(), HasSubstr("left out: room for a finger: box.height >= 40"));
  height->setConstant(50);
  root->layoutIfNeeded();
  minimum->setConstant(60);
  EXPECT_EQ(laidOut(*box).height, 50);
  height->setActive(false);
  EXPECT_EQ(laidOut(*box).height, 60);
  platform.log.clear();
  box->heightAnchor().constraintLessThanOrEqualToConstant(20)->setActive(true);
  EXPECT_EQ(laidOut(*box).height, 60) << "the bound that came last is left out";
  EXPECT_THAT(platform.log.texts("Layout"), SizeIs(1));
}

TEST_F(Layout, ChangesThatFitOnlyTogetherAreNoContradiction) {
  const auto box = constrainedView(*root, "box");
  pinToCorner(*box);
  const auto least = box->widthAnchor().constraintGreaterThanOrEqualToConstant(10);
  const auto most = box->widthAnchor().constraintLessThanOrEqualToConstant(20);
  activate({least, most});
  root->layoutIfNeeded();
  least->setConstant(30);
  most->setConstant(40);
  EXPECT_GE(laidOut(*box).width, 30);
  least->setConstant(5);
  most->setConstant(6);
  EXPECT_LE(laidOut(*box).width, 6);
  EXPECT_TRUE(platform.log.lines().empty());
}

TEST_F(Layout, RefusesNumbersThatMakeNoSense) {
  const auto box = constrainedView(*root, "box");
  const auto width = box->widthAnchor().constraintEqualToConstant(30);
  for (const double bad : {std::nan(""), std::numeric_limits<double>::infinity()}) {
    width->setConstant(bad);
    for (const Rect& frame : {Rect{bad, 0, 1, 1}, {0, bad, 1, 1}, {0, 0, bad, 1}, {0, 0, 1, bad}})
      root->setFrame(frame);
  }
  for (const LayoutPriority bad : {0.99f, 1000.01f, std::nanf("")})
    EXPECT_THROW(width->setPriority(bad), std::invalid_argument);
  for (const LayoutPriority good : {1.f, kLayoutPriorityRequired}) EXPECT_NO_THROW(width->setPriority(good));
  EXPECT_EQ(width->constant(), 30);
  EXPECT_EQ(root->frame(), (Rect{0, 0, 200, 100}));
  EXPECT_THAT(platform.log.texts("Layout", LogLevel::error), SizeIs(10));
}

TEST_F(Layout, MirrorsLeadingAndTrailing) {
  const auto byHand = std::make_shared<View>();
  byHand->setFrame({10, 7, 50, 20});
  root->addSubview(byHand);
  const auto box = constrainedView(*root, "box");
  const auto guide = std::make_shared<LayoutGuide>();
  root->addLayoutGuide(guide);
  activate({box->leadingAnchor().constraintEqualToAnchor(root->leadingAnchor(), 8),
            box->trailingAnchor().constraintEqualToAnchor(byHand->trailingAnchor(), -20),
            box->topAnchor().constraintEqualToAnchor(byHand->topAnchor()),
            box->bottomAnchor().constraintEqualToAnchor(byHand->bottomAnchor(), 1),
            guide->leadingAnchor().constraintEqualToAnchor(box->trailingAnchor()),
            guide->trailingAnchor().constraintEqualToAnchor(root->trailingAnchor())});
  EXPECT_EQ(laidOut(*box), (Rect{8, 7, 32, 21}));
  EXPECT_EQ(guide->layoutFrame(), (Rect{40, 0, 160, 0}));
  // A frame set by hand stays where it is: its trailing edge is now the left one.
  platform.strings.rightToLeft = true;
  root->setNeedsUpdateConstraints();
  EXPECT_EQ(laidOut(*byHand).x, 10);
  EXPECT_EQ(box->frame(), (Rect{30, 7, 162, 21}));
  EXPECT_EQ(guide->layoutFrame(), (Rect{0, 0, 30, 0}));
}

TEST_F(Layout, PutsEdgesOnDevicePixelsOfTheScreen) {
  Environment::current().setScreenScale(2);
  const auto box = constrainedView(*root, "box");
  activate({box->leadingAnchor().constraintEqualToAnchor(root->leadingAnchor(), 3.3),
            box->widthAnchor().constraintEqualToConstant(10.3),
            box->centerYAnchor().constraintEqualToAnchor(root->centerYAnchor()),
            box->heightAnchor().constraintEqualToConstant(7.5)});
  EXPECT_EQ(laidOut(*box), (Rect{3.5, 46.5, 10, 7.5}));
  Environment::current().setScreenScale(1);
  EXPECT_EQ(laidOut(*box), (Rect{3, 46, 11, 8}));
}

TEST_F(Layout, StackArrangesOnBaselinesAndClosesGaps) {
  const auto stack = std::make_shared<StackView>();
  stack->setUsesAutomaticConstraints(false);
  stack->setBaselineRelativeArrangement(true);
  stack->setSpacing(30);
  root->addSubview(stack);
  const auto first = label("one"), second = label("two"), third = label("three");
  for (const auto& view : {first, second, third}) stack->addArrangedSubview(view);
  pinToCorner(*stack);
  stack->widthAnchor().constraintEqualToConstant(120)->setActive(true);
  const auto marker = constrainedView(*root, "marker");
  marker->topAnchor().constraintEqualToAnchor(stack->lastBaselineAnchor())->setActive(true);
  EXPECT_EQ(laidOut(*stack), (Rect{0, 0, 120, 77}));
  EXPECT_EQ(second->frame(), (Rect{0, 30, 120, 17}));
  EXPECT_EQ(marker->frame().y, 74);  // 60 and the ascent of 13.6
  third->setHidden(true);
  EXPECT_EQ(laidOut(*stack).height, 47);
  EXPECT_EQ(marker->frame().y, 44);
  EXPECT_EQ(third->frame(), (Rect{0, 47, 120, 0}));
  first->setHidden(true);
  EXPECT_EQ(laidOut(*stack).height, 17);
  first->setHidden(false);
  stack->setSpacing(50);
  EXPECT_EQ(laidOut(*second).y, 50);
  stack->setBaselineRelativeArrangement(false);
  EXPECT_EQ(laidOut(*second).y, 67);
}

TEST_F(Layout, AStackByItselfIsLaidOutAndKeepsDrawingsOnBaselinesApart) {
  const auto stack = std::make_shared<StackView>();
  const auto first = label("one"), second = label("two");
  const auto shields = std::make_shared<TransitInfoLabelView>();
  shields->setLabelItems({shieldArtwork("A")});
  shields->setArtworkCache(
      ArtworkCache::initWithArtworkManager(TransitArtworkManager::initWithIconManager(platform.shieldRenderer)));
  for (const std::shared_ptr<View>& view :
       {std::shared_ptr<View>(first), std::shared_ptr<View>(shields), std::shared_ptr<View>(second)})
    stack->addArrangedSubview(view);
  const auto expectTops = [&](double height, double ofShields, double ofSecond) {
    stack->setFrame({0, 0, 100, height});
    stack->layoutIfNeeded();
    EXPECT_EQ(shields->frame().y, ofShields);
    EXPECT_EQ(second->frame().y, ofSecond);
  };
  expectTops(62, 17, 45);
  // Descent 3.4 and shields of 28 to the first, shields and capitals of 11.9 to the next; baselines 13.6 and 19.95
  // down.
  stack->setBaselineRelativeArrangement(true);
  expectTops(60, 17, 43);
  shields->setFont(std::make_shared<const Font>(FontDescriptor{50, false}, 1));
  expectTops(77, 12, 60);
}

TEST_F(Layout, AViewKeepsItsConstraintsWhereverItIs) {
  const auto moved = std::make_shared<View>();
  const auto inside = constrainedView(*moved, "inside");
  inside->widthAnchor().constraintEqualToAnchor(moved->widthAnchor())->setActive(true);
  const auto expectFollowed = [&](View& laidOut, double width) {
    moved->setFrame({0, 0, width, 10});
    laidOut.layoutIfNeeded();
    EXPECT_EQ(inside->frame().width, width);
  };
  expectFollowed(*moved, 50);
  root->addSubview(moved);
  expectFollowed(*root, 60);
  moved->removeFromSuperview();
  expectFollowed(*moved, 70);
}

TEST_F(Layout, LabelTakesTheLinesItsWidthNeeds) {
  struct Case {
    const char* text;
    std::size_t lines;
    double width, height;  // of the box it is in; height 0: free
    double expectedHeight;
    std::size_t drawnLines;
    bool clipped = false;
  };
  const std::string tenThousand(10'000, 'x');
  const Case cases[] = {
      {"aaaa bbbb cccc", 0, 40, 0, 51, 3},
      {"aaaa bbbb cccc", 2, 40, 0, 34, 2},
      {"aaaa bbbb cccc", 1, 40, 0, 17, 1},
      {"aaaa bbbb cccc", 0, 40, 40, 34, 2},
      {"aaaa bbbb cccc", 4, 40, 40, 34, 2},
      {"aaaa bbbb cccc", 1, 119, 0, 17, 1},
      {"aaaa bbbb cccc", 0, 40, 14, 14, 1, true},
      {"aaaa bbbb cccc", 0, 40, 13, 13, 0, true},
      {"", 0, 40, 0, 17, 0},
      {tenThousand.c_str(), 0, 85, 60, 51, 3},
      {"\xcc\x88\xcc\x88\xcc\x88", 0, 40, 0, 17, 1},
  };
  for (const Case& c : cases) {
    const auto view = std::make_shared<View>();
    view->setFrame({0, 0, c.width, 500});
    const auto text = label("something else", 7);
    text->setFont(std::make_shared<const Font>(FontDescriptor{50, false}, 1));
    text->setUsesAutomaticConstraints(false);
    view->addSubview(text);
    activate({text->leadingAnchor().constraintEqualToAnchor(view->leadingAnchor()),
              text->topAnchor().constraintEqualToAnchor(view->topAnchor()),
              text->trailingAnchor().constraintEqualToAnchor(view->trailingAnchor())});
    if (c.height > 0) text->heightAnchor().constraintLessThanOrEqualToConstant(c.height)->setActive(true);
    const auto marker = constrainedView(*view, "marker");
    marker->topAnchor().constraintEqualToAnchor(text->lastBaselineAnchor())->setActive(true);
    const auto first = constrainedView(*view, "first");
    first->topAnchor().constraintEqualToAnchor(text->firstBaselineAnchor())->setActive(true);
    const auto stretch = text->heightAnchor().constraintEqualToConstant(400);
    stretch->setPriority(kLayoutPriorityHugging - 1);
    stretch->setActive(true);
    view->layoutIfNeeded();
    text->setText(std::nullopt);
    view->layoutIfNeeded();
    text->setFont(nullptr);
    view->layoutIfNeeded();
    text->setNumberOfLines(c.lines);
    view->layoutIfNeeded();
    text->setText(c.text);
    view->layoutIfNeeded();
    SCOPED_TRACE(std::string(c.text).substr(0, 20) + " in " + std::to_string(c.height));
    EXPECT_EQ(text->frame(), (Rect{0, 0, c.width, c.expectedHeight}));
    const double descent = c.clipped ? c.height - marker->frame().y : 3.4;
    EXPECT_EQ(marker->frame().y, std::round(c.expectedHeight - descent));
    EXPECT_EQ(first->frame().y, 14);
    RecordingPainter painter;
    view->draw(painter);
    EXPECT_EQ(painter.texts.empty() ? 0 : painter.texts[0].lines, c.drawnLines);
    EXPECT_EQ(painter.clips.at(0) == text->bounds(), c.clipped);
  }
  const auto free = label("aaaa");
  free->setUsesAutomaticConstraints(false);
  root->addSubview(free);
  const auto stretch = free->widthAnchor().constraintEqualToConstant(150);
  stretch->setPriority(kLayoutPriorityHugging - 1);
  stretch->setActive(true);
  EXPECT_EQ(laidOut(*free).width, 34);
}

TEST_F(Layout, ShortOfRoomTheLastTextGivesWayButKeepsItsFirstLine) {
  const auto stack = std::make_shared<StackView>();
  stack->setUsesAutomaticConstraints(false);
  root->addSubview(stack);
  const auto first = label("a b", 0), second = label("a b c d e f", 0);
  stack->addArrangedSubview(first);
  stack->addArrangedSubview(second);
  pinToCorner(*stack);
  const auto height = stack->heightAnchor().constraintLessThanOrEqualToConstant(90);
  activate({height, stack->widthAnchor().constraintEqualToConstant(10)});
  for (const auto& [room, firstHeight, secondHeight] :
       {std::array{200, 34, 102}, {90, 34, 51}, {55, 34, 17}, {40, 17, 17}, {25, 17, 8}, {90, 34, 51}}) {
    height->setConstant(room);
    EXPECT_EQ(laidOut(*first).height, firstHeight) << room;
    EXPECT_EQ(second->frame(), (Rect{0, static_cast<double>(firstHeight), 10, static_cast<double>(secondHeight)}))
        << room;
  }
}

}  // namespace
}  // namespace nimbo
