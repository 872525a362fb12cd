#include <gmock/gmock.h>

#include <cmath>

#include "platform/ui/Environment.h"
#include "support/TestPlatform.h"
#include "ui/DynamicTypeWizard.h"

namespace nimbo {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

/// Keeps the names of its operations as they are performed, with what a stack's spacing is then.
class Listener final : public Object {
 public:
  Listener(std::string name, std::vector<std::string>& heard, StackView& stack)
      : _name(std::move(name)), _heard(heard), _stack(stack) {}
  bool respondsToOperation(std::string_view name) const override { return name == "refresh" || name == "redraw"; }
  void performOperation(std::string_view name) override {
    _heard.push_back(_name + " " + std::string(name) + " at " + std::to_string(std::lround(_stack.spacing())));
  }
  std::string_view className() const override { return "Listener"; }

 private:
  std::string _name;
  std::vector<std::string>& _heard;
  StackView& _stack;
};

/// A view on a screen of its own.
class ViewOnScreen final : public View {
 public:
  explicit ViewOnScreen(double scale) : _scale(scale) {}
  double screenScale() const override { return _scale; }

 private:
  double _scale;
};

class DynamicType : public testing::Test {
 protected:
  static FontRef headline() { return Font::preferredFont(TextStyle::headline); }
  static void setTextSize(ContentSizeCategory category) { Environment::current().setContentSizeCategory(category); }
  std::shared_ptr<Listener> listener(const std::string& name) {
    return std::make_shared<Listener>(name, heard, *stack);
  }
  static void perform(const std::shared_ptr<Listener>& object, const std::string& selector, std::uint64_t order) {
    DynamicTypeWizard::makeObject_performSelector_whenSizeCategoryChangesWithOrder(object, selector, order);
  }

  TestPlatform platform;
  std::vector<std::string> heard;
  std::shared_ptr<StackView> stack = std::make_shared<StackView>();
  std::shared_ptr<StyledLabel> label = std::make_shared<StyledLabel>();
};

TEST_F(DynamicType, ValueWithoutAFontIsUnscaled) {
  EXPECT_EQ(DynamicTypeValue(21, nullptr).scaledValue(), 21);
  EXPECT_EQ(DynamicTypeValue(21, [] { return FontRef(); }).scaledValue(), 21);
  setTextSize(ContentSizeCategory::accessibilityExtraExtraExtraLarge);
  EXPECT_DOUBLE_EQ(DynamicTypeValue(17, &headline).scaledValue(), 53);
}

TEST_F(DynamicType, FontsAndLengthsFollowAtOnceAndAfterEachChange) {
  const auto view = std::make_shared<View>();
  const auto width = view->widthAnchor().constraintEqualToConstant(1);
  setTextSize(ContentSizeCategory::extraLarge);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(label, &headline);
  DynamicTypeWizard::autoscaleStackView_spacing_withFontProvider(stack, 21, &headline);
  EXPECT_EQ(DynamicTypeWizard::autoscaledConstraint_constant_withFontProvider(width, 34, &headline), width);
  EXPECT_EQ(label->font()->descriptor().pointSize, 19);
  EXPECT_EQ(stack->spacing(), 23);  // 23.47 to the nearest pixel
  EXPECT_EQ(width->constant(), 38);
  setTextSize(ContentSizeCategory::small);
  EXPECT_EQ(label->font()->descriptor().pointSize, 15);
  EXPECT_EQ(stack->spacing(), 19);
  EXPECT_EQ(width->constant(), 30);

  DynamicTypeWizard::updateUnscaledConstantValue_fontProvider_forConstraint(17, nullptr, width);
  EXPECT_EQ(width->constant(), 17);
  setTextSize(ContentSizeCategory::extraLarge);
  EXPECT_EQ(width->constant(), 17);

  // Another provider takes the place of the first.
  DynamicTypeWizard::autorefreshLabel_withFontProvider(label,
                                                       [] { return Font::preferredFont(TextStyle::subheadline); });
  setTextSize(ContentSizeCategory::large);
  EXPECT_EQ(label->font()->descriptor().pointSize, 15);
}

TEST_F(DynamicType, RegistersNothingWithoutAProvider) {
  const auto view = std::make_shared<View>();
  const auto width = view->widthAnchor().constraintEqualToConstant(7);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(label, nullptr);
  DynamicTypeWizard::autoscaleStackView_spacing_withFontProvider(stack, 21, nullptr);
  DynamicTypeWizard::autoscaledConstraint_constant_withFontProvider(width, 21, nullptr);
  DynamicTypeWizard::updateUnscaledConstantValue_fontProvider_forConstraint(9, &headline, width);
  setTextSize(ContentSizeCategory::extraLarge);
  EXPECT_EQ(label->font()->descriptor().pointSize, 17);
  EXPECT_EQ(stack->spacing(), 0);
  EXPECT_EQ(width->constant(), 7);
}

TEST_F(DynamicType, OperationsRunInTheirGroups) {
  DynamicTypeWizard::autoscaleStackView_spacing_withFontProvider(stack, 17, &headline);
  const auto first = listener("first"), second = listener("second"), third = listener("third");
  perform(third, "refresh", 2);
  perform(second, "refresh", 1);
  perform(second, "redraw", 1);
  perform(second, "unheardOf", 1);
  perform(first, "refresh", 0);
  perform(first, "redraw", 3);
  setTextSize(ContentSizeCategory::extraLarge);
  EXPECT_THAT(heard, ElementsAre("first refresh at 17", "second redraw at 19", "third refresh at 19"));
  heard.clear();
  DynamicTypeWizard::unregisterObject(*second);
  setTextSize(ContentSizeCategory::large);
  EXPECT_THAT(heard, ElementsAre("first refresh at 19", "third refresh at 17"));
}

TEST_F(DynamicType, UnregisteringKeepsTheFont) {
  DynamicTypeWizard::autorefreshLabel_withFontProvider(label, &headline);
  DynamicTypeWizard::unregisterObject(*label);
  setTextSize(ContentSizeCategory::extraLarge);
  EXPECT_EQ(label->font()->descriptor().pointSize, 19);
}

TEST_F(DynamicType, RegistrationsEndWithTheirObjects) {
  int asked = 0;
  std::weak_ptr<StyledLabel> weakLabel = label;
  auto gone = listener("gone");
  perform(gone, "refresh", 0);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(label, [&asked] {
    ++asked;
    return headline();
  });
  gone.reset();
  label.reset();
  EXPECT_TRUE(weakLabel.expired());
  setTextSize(ContentSizeCategory::extraLarge);
  EXPECT_EQ(asked, 1);
  EXPECT_THAT(heard, IsEmpty());
}

TEST_F(DynamicType, LengthsAreRoundedForTheScreenOfTheFirstItem) {
  Environment::current().setScreenScale(3);
  const auto view = std::make_shared<ViewOnScreen>(1.0), other = std::make_shared<ViewOnScreen>(2.0);
  const auto guide = std::make_shared<LayoutGuide>(), loose = std::make_shared<LayoutGuide>();
  other->addLayoutGuide(guide);
  const DynamicTypeValue value(10.3, nullptr);
  const auto rounded = [&](LayoutItem& item) {
    const auto constraint = item.heightAnchor().constraintEqualToConstant(0);
    ScaleConstraintToDynamicValue(*constraint, value);
    return constraint->constant();
  };
  EXPECT_DOUBLE_EQ(rounded(*view), 10);
  EXPECT_DOUBLE_EQ(rounded(*guide), 10.5);
  EXPECT_DOUBLE_EQ(rounded(*loose), 31 / 3.0);
}

}  // namespace
}  // namespace nimbo
