#include "ui/NBTransitSummaryCell.h"

#include "platform/Localization.h"
#include "platform/ui/RoundToViewScale.h"
#include "ui/DynamicTypeWizard.h"

namespace nimbo {

namespace {

constexpr double kInitialRowHeight = 110.0;
constexpr double kBaselineSpacing = 35.0;
constexpr double kSpaceBetweenShields = 5.0;
constexpr std::int64_t kIconSize = 7;
constexpr std::int64_t kShieldSize = 7;
constexpr std::int64_t kPrimaryVibrancyStyle = 101;
constexpr std::string_view kUpdateOperation = "_updatePrimaryLabelToContentGuideConstaint";

}  // namespace

std::shared_ptr<NBTransitSummaryCell> NBTransitSummaryCell::initWithStyle_reuseIdentifier(
    TableCellStyle style, const std::string& reuseIdentifier) {
  auto cell = std::make_shared<NBTransitSummaryCell>(style, reuseIdentifier);
  cell->_createSubviews();
  return cell;
}

FontRef NBTransitSummaryCell::_primaryFont() { return preferredTableCellFont(TextStyle::headline, FontTraits::none); }

void NBTransitSummaryCell::_createSubviews() {
  const std::weak_ptr<Object> weakCell = weak_from_this();
  const FontProvider primaryFont = [weakCell] { return weakCell.expired() ? nullptr : _primaryFont(); };

  _contentGuide = std::make_shared<LayoutGuide>();
  _contentGuide->setLayoutName("contentGuide");
  addLayoutGuide(_contentGuide);

  _stackView = std::make_shared<StackView>();
  _stackView->setUsesAutomaticConstraints(false);
  _stackView->setBaselineRelativeArrangement(true);
  _stackView->setSpacing(kBaselineSpacing);
  contentView()->addSubview(_stackView);

  _vibrancyViewForPrimaryLabel =
      std::make_shared<VisualEffectWrappingView>(VisualEffect::widgetEffectForVibrancyStyle(kPrimaryVibrancyStyle));
  _vibrancyViewForPrimaryLabel->setUsesAutomaticConstraints(false);
  _stackView->addArrangedSubview(_vibrancyViewForPrimaryLabel);
  _primaryLabel = std::make_shared<StyledLabel>();
  _primaryLabel->setLayoutName("primaryLabel");
  _primaryLabel->setNumberOfLines(1);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(_primaryLabel, primaryFont);
  _vibrancyViewForPrimaryLabel->setWrappedView(_primaryLabel);

  _artworksLabel = std::make_shared<TransitInfoLabelView>();
  _artworksLabel->setLayoutName("artworksLabel");
  _artworksLabel->setIconSize(kIconSize);
  _artworksLabel->setShieldSize(kShieldSize);
  _artworksLabel->setSpaceBetweenShields(kSpaceBetweenShields);
  _artworksLabel->setFont(Font::preferredFont(TextStyle::body));
  _artworksLabel->setUsesAutomaticConstraints(false);
  _artworksLabel->setTextColor(SystemColor::systemGrey);
  _stackView->addArrangedSubview(_artworksLabel);

  LayoutConstraint::activateConstraints(_initialConstraints());
}

std::vector<LayoutConstraintRef> NBTransitSummaryCell::_initialConstraints() {
  View& content = *contentView();
  LayoutGuide& guide = *_contentGuide;
  StackView& stack = *_stackView;

  _rowHeightConstraint = content.heightAnchor().constraintEqualToConstant(kInitialRowHeight);
  _primaryLabelToContentGuideConstraint = stack.firstBaselineAnchor().constraintEqualToAnchor(guide.topAnchor());
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
      _primaryLabelToContentGuideConstraint,
      guide.bottomAnchor().constraintEqualToAnchor(stack.bottomAnchor()),
      stack.leadingAnchor().constraintEqualToAnchor(guide.leadingAnchor()),
      stack.trailingAnchor().constraintEqualToAnchor(guide.trailingAnchor()),
  };
}

void NBTransitSummaryCell::_updatePrimaryLabelToContentGuideConstaint() {
  _primaryLabelToContentGuideConstraint->setConstant(roundToViewScale(_primaryLabel->font()->capHeight(), this));
}

void NBTransitSummaryCell::setItem(NBTransitSummaryItemRef item) {
  if (absentOrEqual(item, _item)) return;
  _item = std::move(item);
  _updateLayout();
}

void NBTransitSummaryCell::_updateLayout() {
  _primaryLabel->setText(_item ? std::optional(_item->primaryText()) : std::nullopt);
  _artworksLabel->setLabelItems(_item ? _item->artworks() : TransitArtworks{});
  _artworksLabel->setHidden(_artworksLabel->labelItems().empty());
}

void NBTransitSummaryCell::layoutSubviews() {
  StyledTableCell::layoutSubviews();
  contentView()->layoutIfNeeded();
  _artworksLabel->setMaxWidth_truncationTextGenerator(_primaryLabel->frame().width, [](std::uint64_t notShown) {
    return LocalizedFormat(LocalizedString("Transit_Incident_Not_Displayed_Incidents"), {notShown});
  });
}

Size NBTransitSummaryCell::systemLayoutSizeFittingSize_withHorizontalFittingPriority_verticalFittingPriority(
    Size size, LayoutPriority horizontalFittingPriority, LayoutPriority verticalFittingPriority) {
  layoutIfNeeded();
  return StyledTableCell::systemLayoutSizeFittingSize_withHorizontalFittingPriority_verticalFittingPriority(
      size, horizontalFittingPriority, verticalFittingPriority);
}

bool NBTransitSummaryCell::respondsToOperation(std::string_view name) const { return name == kUpdateOperation; }

void NBTransitSummaryCell::performOperation(std::string_view name) {
  if (name == kUpdateOperation) _updatePrimaryLabelToContentGuideConstaint();
}

}  // namespace nimbo
