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

/// Has the operations "first" and "second", and notes which are performed.
class Performer final : public Object {
 public:
  explicit Performer(std::function<void(std::string)> note) : _note(std::move(note)) {}
  bool respondsToOperation(std::string_view name) const override { return name == "first" || name == "second"; }
  void performOperation(std::string_view name) override { _note(std::string(name)); }
  std::string_view className() const override { return "Performer"; }

 private:
  std::function<void(std::string)> _note;
};

TEST_F(DynamicType, OperationsArePerformedByGroupsBetweenFontsAndLengths) {
  std::vector<std::string> notes;
  const auto performer = [&](int number) {
    return std::make_shared<Performer>([&, number](const std::string& name) {
      notes.push_back(name + std::to_string(number) +
                      testing::PrintToString(std::pair(label->font()->descriptor().pointSize, stack->spacing())));
    });
  };
  const auto perform = &DynamicTypeWizard::makeObject_performSelector_whenSizeCategoryChangesWithOrder;
  const std::array performers{performer(0), performer(1), performer(2), performer(3)};
  for (const std::uint64_t group : {2u, 1u, 0u, 3u}) perform(performers[group], "first", group);
  perform(performers[1], "second", 1);
  perform(performers[1], "third", 1);
  for (const std::uint64_t group : {0u, 1u, 2u}) perform(performers[3], "first", group);
  DynamicTypeWizard::unregisterObject(*performers[3]);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(label, &headline);
  DynamicTypeWizard::autoscaleStackView_spacing_withFontProvider(stack, 17, &headline);
  setTextSize(ContentSizeCategory::small);
  EXPECT_THAT(notes, testing::ElementsAre("first0(15, 17)", "second1(15, 15)", "first2(15, 15)"));
}

TEST_F(DynamicType, LengthsAreRoundedForTheScreenOfTheFirstItem) {
  class FineView final : public View {
    double screenScale() const override { return 4; }
  };
  const auto view = std::make_shared<FineView>();
  const auto guide = std::make_shared<LayoutGuide>(), loose = std::make_shared<LayoutGuide>();
  view->addLayoutGuide(guide);
  setTextSize(ContentSizeCategory::extraLarge);
  Environment::current().setScreenScale(2);
  const std::pair<LayoutItem*, double> cases[] = {{view.get(), 8.25}, {guide.get(), 8.25}, {loose.get(), 8.5}};
  for (const auto& [item, expected] : cases) {
    const auto width = item->widthAnchor().constraintEqualToConstant(0);
    DynamicTypeWizard::autoscaledConstraint_constant_withFontProvider(width, 7.4, &headline);
    EXPECT_EQ(width->constant(), expected);
  }
  EXPECT_EQ(DynamicTypeValue(7.4, [] { return FontRef(); }).scaledValue(), 7.4);
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
