#include "ui/NBTransitSummaryCell.h"

#include "platform/Localization.h"

namespace nimbo {

namespace {

constexpr double kSpacingOfShields = 35.0;
constexpr double kSpaceBetweenShields = 5.0;
constexpr std::int64_t kIconSize = 7;
constexpr std::int64_t kShieldSize = 7;

}  // namespace

std::shared_ptr<NBTransitSummaryCell> NBTransitSummaryCell::initWithStyle_reuseIdentifier(
    TableCellStyle style, const std::string& reuseIdentifier) {
  auto cell = std::make_shared<NBTransitSummaryCell>(style, reuseIdentifier);
  cell->_createSubviews();
  return cell;
}

FontRef NBTransitSummaryCell::_primaryFont() { return preferredTableCellFont(TextStyle::headline, FontTraits::none); }

void NBTransitSummaryCell::_createSubviews() {
  createStack();
  _stackView->setSpacing(kSpacingOfShields);
  createPrimaryLabel(providerOfFont(_primaryFont), 1);

  _artworksLabel = std::make_shared<TransitInfoLabelView>();
  _artworksLabel->setLayoutName("artworksLabel");
  _artworksLabel->setIconSize(kIconSize);
  _artworksLabel->setShieldSize(kShieldSize);
  _artworksLabel->setSpaceBetweenShields(kSpaceBetweenShields);
  _artworksLabel->setFont(Font::preferredFont(TextStyle::body));
  _artworksLabel->setTextColor(SystemColor::systemGrey);
  _stackView->addArrangedSubview(_artworksLabel);

  LayoutConstraint::activateConstraints(_initialConstraints());
}

std::vector<LayoutConstraintRef> NBTransitSummaryCell::_initialConstraints() {
  LayoutGuide& guide = *_contentGuide;
  StackView& stack = *_stackView;
  std::vector<LayoutConstraintRef> constraints = rowConstraints(stack.firstBaselineAnchor());
  constraints.insert(constraints.end(), {
                                            _primaryLabelToContentGuideConstraint,
                                            guide.bottomAnchor().constraintEqualToAnchor(stack.bottomAnchor()),
                                            stack.leadingAnchor().constraintEqualToAnchor(guide.leadingAnchor()),
                                            stack.trailingAnchor().constraintEqualToAnchor(guide.trailingAnchor()),
                                        });
  return constraints;
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
  NBTransitRowCell::layoutSubviews();
  contentView()->layoutIfNeeded();
  _artworksLabel->setMaxWidth_truncationTextGenerator(_primaryLabel->frame().width, [](std::uint64_t notShown) {
    return LocalizedFormat(LocalizedString("Transit_Incident_Not_Displayed_Incidents"), {notShown});
  });
}

Size NBTransitSummaryCell::systemLayoutSizeFittingSize_withHorizontalFittingPriority_verticalFittingPriority(
    Size size, LayoutPriority horizontalFittingPriority, LayoutPriority verticalFittingPriority) {
  layoutIfNeeded();
  return NBTransitRowCell::systemLayoutSizeFittingSize_withHorizontalFittingPriority_verticalFittingPriority(
      size, horizontalFittingPriority, verticalFittingPriority);
}

}  // namespace nimbo
