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

}  // namespace
}  // namespace nimbo
