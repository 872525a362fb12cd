#include <gmock/gmock.h>

#include <cmath>
#include <limits>

#include "platform/ui/Environment.h"
#include "platform/ui/StackView.h"
#include "platform/ui/StyledLabel.h"
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
  view->setUsesAutomaticConstraints(false);
  view->setNumberOfLines(lines);
  view->setText(text);
  return view;
}

class Layout : public testing::Test {
 protected:
  Layout() { root->setFrame({0, 0, 200, 100}); }

  /// Pins a view to the root's leading top corner.
  void pinToCorner(View& view) {
    LayoutConstraint::activateConstraints({view.leadingAnchor().constraintEqualToAnchor(root->leadingAnchor()),
                                           view.topAnchor().constraintEqualToAnchor(root->topAnchor())});
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
  LayoutConstraint::activateConstraints(
      {narrow, wide, box->bottomAnchor().constraintEqualToAnchor(root->bottomAnchor(), -20)});
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame(), (Rect{0, 0, 30, 80}));
  narrow->setConstant(40);
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame().width, 40);
  narrow->setPriority(399);
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame().width, 90);
  wide->setActive(false);
  root->setFrame({0, 0, 200, 60});
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame(), (Rect{0, 0, 40, 40}));
  EXPECT_TRUE(platform.log.lines().empty());
}

TEST_F(Layout, LogsAContradictionOnceAndLeavesTheBoundOutWhileItLasts) {
  const auto box = constrainedView(*root, "box");
  pinToCorner(*box);
  const auto height = box->heightAnchor().constraintEqualToConstant(10);
  const auto minimum = box->heightAnchor().constraintGreaterThanOrEqualToConstant(40);
  minimum->setIdentifier("room for a finger");
  LayoutConstraint::activateConstraints({minimum, height});
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
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame().height, 50);
  height->setActive(false);
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame().height, 60);
}

TEST_F(Layout, ChangesThatFitOnlyTogetherAreNoContradiction) {
  const auto box = constrainedView(*root, "box");
  pinToCorner(*box);
  const auto least = box->widthAnchor().constraintGreaterThanOrEqualToConstant(10);
  const auto most = box->widthAnchor().constraintLessThanOrEqualToConstant(20);
  LayoutConstraint::activateConstraints({least, most});
  root->layoutIfNeeded();
  least->setConstant(30);
  most->setConstant(40);
  root->layoutIfNeeded();
  EXPECT_GE(box->frame().width, 30);
  least->setConstant(5);
  most->setConstant(6);
  root->layoutIfNeeded();
  EXPECT_LE(box->frame().width, 6);
  EXPECT_TRUE(platform.log.lines().empty());
}

TEST_F(Layout, RefusesNumbersThatAreNotFinite) {
  const auto box = constrainedView(*root, "box");
  const auto width = box->widthAnchor().constraintEqualToConstant(30);
  for (const double bad : {std::nan(""), std::numeric_limits<double>::infinity()}) {
    width->setConstant(bad);
    root->setFrame({0, 0, bad, 10});
  }
  EXPECT_EQ(width->constant(), 30);
  EXPECT_EQ(root->frame(), (Rect{0, 0, 200, 100}));
  EXPECT_THAT(platform.log.texts("Layout", LogLevel::error), SizeIs(4));
}

TEST_F(Layout, MirrorsLeadingAndTrailing) {
  const auto byHand = std::make_shared<View>();
  byHand->setFrame({10, 0, 50, 20});
  root->addSubview(byHand);
  const auto box = constrainedView(*root, "box");
  const auto guide = std::make_shared<LayoutGuide>();
  root->addLayoutGuide(guide);
  LayoutConstraint::activateConstraints({box->leadingAnchor().constraintEqualToAnchor(root->leadingAnchor(), 8),
                                         box->trailingAnchor().constraintEqualToAnchor(byHand->trailingAnchor(), -20),
                                         guide->leadingAnchor().constraintEqualToAnchor(box->trailingAnchor()),
                                         guide->trailingAnchor().constraintEqualToAnchor(root->trailingAnchor())});
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame(), (Rect{8, 0, 32, 0}));
  EXPECT_EQ(guide->layoutFrame(), (Rect{40, 0, 160, 0}));
  // A frame set by hand stays where it is: its trailing edge is now the left one.
  root->setRightToLeft(true);
  root->layoutIfNeeded();
  EXPECT_EQ(byHand->frame().x, 10);
  EXPECT_EQ(box->frame(), (Rect{30, 0, 162, 0}));
  EXPECT_EQ(guide->layoutFrame(), (Rect{0, 0, 30, 0}));
  root->setRightToLeft(std::nullopt);
  platform.strings.rightToLeft = true;
  root->setNeedsUpdateConstraints();
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame().x, 30);
}

TEST_F(Layout, PutsEdgesOnDevicePixelsOfTheScreen) {
  Environment::current().setScreenScale(2);
  const auto box = constrainedView(*root, "box");
  LayoutConstraint::activateConstraints({box->leadingAnchor().constraintEqualToAnchor(root->leadingAnchor(), 3.3),
                                         box->widthAnchor().constraintEqualToConstant(10.3),
                                         box->centerYAnchor().constraintEqualToAnchor(root->centerYAnchor()),
                                         box->heightAnchor().constraintEqualToConstant(7.5)});
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame(), (Rect{3.5, 46.5, 10, 7.5}));
  Environment::current().setScreenScale(1);
  root->layoutIfNeeded();
  EXPECT_EQ(box->frame(), (Rect{3, 46, 11, 8}));
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
  root->layoutIfNeeded();
  EXPECT_EQ(stack->frame(), (Rect{0, 0, 120, 77}));
  EXPECT_EQ(second->frame(), (Rect{0, 30, 120, 17}));
  EXPECT_EQ(marker->frame().y, 74);  // 60 and the ascent of 13.6
  third->setHidden(true);
  root->layoutIfNeeded();
  EXPECT_EQ(stack->frame().height, 47);
  EXPECT_EQ(marker->frame().y, 44);
  first->setHidden(true);
  stack->setSpacing(10);
  root->layoutIfNeeded();
  EXPECT_EQ(stack->frame().height, 17);
  first->setHidden(false);
  stack->setBaselineRelativeArrangement(false);
  root->layoutIfNeeded();
  EXPECT_EQ(second->frame().y, 27);
}

TEST_F(Layout, LabelTakesTheLinesItsWidthNeeds) {
  struct Case {
    const char* text;
    std::size_t lines;
    double width, height;  // of the box it is in; height 0: free
    double expectedHeight;
  };
  const std::string tenThousand(10'000, 'x');
  const Case cases[] = {
      {"aaaa bbbb cccc", 0, 40, 0, 51},     {"aaaa bbbb cccc", 2, 40, 0, 34},
      {"aaaa bbbb cccc", 1, 40, 0, 17},     {"aaaa bbbb cccc", 0, 40, 40, 34},
      {"aaaa bbbb cccc", 0, 40, 10, 10},    {"", 0, 40, 0, 17},
      {tenThousand.c_str(), 0, 85, 60, 51}, {"\xcc\x88\xcc\x88\xcc\x88", 0, 40, 0, 17},
  };
  for (const Case& c : cases) {
    const auto view = std::make_shared<View>();
    view->setFrame({0, 0, c.width, 500});
    const auto text = label(c.text, c.lines);
    view->addSubview(text);
    LayoutConstraint::activateConstraints({text->leadingAnchor().constraintEqualToAnchor(view->leadingAnchor()),
                                           text->topAnchor().constraintEqualToAnchor(view->topAnchor()),
                                           text->trailingAnchor().constraintEqualToAnchor(view->trailingAnchor())});
    if (c.height > 0) text->heightAnchor().constraintLessThanOrEqualToConstant(c.height)->setActive(true);
    view->layoutIfNeeded();
    EXPECT_EQ(text->frame(), (Rect{0, 0, c.width, c.expectedHeight})) << std::string(c.text).substr(0, 20) << c.width;
  }
}

TEST_F(Layout, ShortOfRoomTheLastTextGivesWayButKeepsItsFirstLine) {
  const auto stack = std::make_shared<StackView>();
  stack->setUsesAutomaticConstraints(false);
  root->addSubview(stack);
  const auto first = label("a b c", 0), second = label("a b c d e f", 0);
  stack->addArrangedSubview(first);
  stack->addArrangedSubview(second);
  pinToCorner(*stack);
  const auto height = stack->heightAnchor().constraintLessThanOrEqualToConstant(90);
  LayoutConstraint::activateConstraints({height, stack->widthAnchor().constraintEqualToConstant(10)});
  for (const auto& [room, firstHeight, secondHeight] :
       {std::array{200, 51, 102}, {90, 51, 34}, {70, 51, 17}, {40, 17, 17}, {90, 51, 34}}) {
    height->setConstant(room);
    root->layoutIfNeeded();
    EXPECT_EQ(first->frame().height, firstHeight) << room;
    EXPECT_EQ(second->frame().height, secondHeight) << room;
  }
}

}  // namespace
}  // namespace nimbo
