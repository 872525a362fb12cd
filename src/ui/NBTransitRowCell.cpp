#include "ui/NBTransitRowCell.h"

#include "platform/ui/View.h"

namespace nimbo {

namespace {

constexpr double kInitialRowHeight = 110.0;
constexpr std::int64_t kPrimaryVibrancyStyle = 101;
constexpr std::string_view kUpdateOperation = "_updatePrimaryLabelToContentGuideConstaint";

}  // namespace

std::shared_ptr<VisualEffectWrappingView> NBTransitRowCell::vibrancyView(std::int64_t style) {
  auto view = std::make_shared<VisualEffectWrappingView>(VisualEffect::widgetEffectForVibrancyStyle(style));
  view->setUsesAutomaticConstraints(false);
  return view;
}

FontProvider NBTransitRowCell::providerOfFont(FontRef (*font)()) {
  return [weakCell = std::weak_ptr<Object>(weak_from_this()), font] { return weakCell.expired() ? nullptr : font(); };
}

void NBTransitRowCell::createStack() {
  _contentGuide = std::make_shared<LayoutGuide>();
  _contentGuide->setLayoutName("contentGuide");
  addLayoutGuide(_contentGuide);

  _stackView = std::make_shared<StackView>();
  _stackView->setUsesAutomaticConstraints(false);
  _stackView->setBaselineRelativeArrangement(true);
  contentView()->addSubview(_stackView);
}

void NBTransitRowCell::createPrimaryLabel(FontProvider font, std::int64_t numberOfLines) {
  _vibrancyViewForPrimaryLabel = vibrancyView(kPrimaryVibrancyStyle);
  _stackView->addArrangedSubview(_vibrancyViewForPrimaryLabel);
  _primaryLabel = std::make_shared<StyledLabel>();
  _primaryLabel->setLayoutName("primaryLabel");
  _primaryLabel->setNumberOfLines(numberOfLines);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(_primaryLabel, std::move(font));
  _vibrancyViewForPrimaryLabel->setWrappedView(_primaryLabel);
}

std::vector<LayoutConstraintRef> NBTransitRowCell::rowConstraints(const LayoutAnchor& firstBaseline) {
  View& content = *contentView();
  LayoutGuide& guide = *_contentGuide;
  _rowHeightConstraint = content.heightAnchor().constraintEqualToConstant(kInitialRowHeight);
  _primaryLabelToContentGuideConstraint = firstBaseline.constraintEqualToAnchor(guide.topAnchor());
  _updatePrimaryLabelToContentGuideConstaint();
  DynamicTypeWizard::makeObject_performSelector_whenSizeCategoryChangesWithOrder(shared_from_this(),
                                                                                 std::string(kUpdateOperation), 1);
  return {
      _rowHeightConstraint,
      guide.centerYAnchor().constraintEqualToAnchor(content.centerYAnchor()),
      guide.leadingAnchor().constraintEqualToAnchor(content.leadingAnchor()),
      guide.trailingAnchor().constraintEqualToAnchor(content.trailingAnchor()),
      guide.topAnchor().constraintGreaterThanOrEqualToAnchor(content.topAnchor()),
      guide.bottomAnchor().constraintLessThanOrEqualToAnchor(content.bottomAnchor()),
  };
}

void NBTransitRowCell::_updatePrimaryLabelToContentGuideConstaint() {
  _primaryLabelToContentGuideConstraint->setConstant(roundToViewScale(_primaryLabel->font()->capHeight(), this));
}

bool NBTransitRowCell::respondsToOperation(std::string_view name) const { return name == kUpdateOperation; }

void NBTransitRowCell::performOperation(std::string_view name) {
  if (name == kUpdateOperation) _updatePrimaryLabelToContentGuideConstaint();
}

}  // namespace nimbo
