#include <gtest/gtest.h>

#include "platform/ui/Environment.h"
#include "support/TestPlatform.h"
#include "ui/DynamicTypeWizard.h"

namespace nimbo {
namespace {

class DynamicType : public testing::Test {
 protected:
  static FontRef headline() { return Font::preferredFont(TextStyle::headline); }
  static void setTextSize(ContentSizeCategory category) { Environment::current().setContentSizeCategory(category); }

  TestPlatform platform;
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

TEST_F(DynamicType, RegistrationsEndWithTheirObjects) {
  int asked = 0;
  std::weak_ptr<StyledLabel> weakLabel = label;
  DynamicTypeWizard::autorefreshLabel_withFontProvider(label, [&asked] {
    ++asked;
    return headline();
  });
  label.reset();
  EXPECT_TRUE(weakLabel.expired());
  setTextSize(ContentSizeCategory::extraLarge);
  EXPECT_EQ(asked, 1);
}

}  // namespace
}  // namespace nimbo
