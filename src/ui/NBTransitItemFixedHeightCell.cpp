#include "ui/NBTransitItemFixedHeightCell.h"

#include "platform/ui/RoundToViewScale.h"
#include "ui/DynamicTypeWizard.h"

namespace nimbo {

namespace {

constexpr double kInitialRowHeight = 110.0;
constexpr double kBaselineSpacing = 21.0;
constexpr double kShieldMargin = 8.0;
constexpr LayoutPriority kCapLinePriority = 750;
constexpr std::int64_t kPrimaryVibrancyStyle = 101;
constexpr std::int64_t kSecondaryVibrancyStyle = 102;
constexpr std::string_view kUpdateOperation = "_updatePrimaryLabelToContentGuideConstaint";

}  // namespace

std::shared_ptr<NBTransitItemFixedHeightCell> NBTransitItemFixedHeightCell::initWithStyle_reuseIdentifier(
    TableCellStyle style, const std::string& reuseIdentifier) {
  auto cell = std::make_shared<NBTransitItemFixedHeightCell>(style, reuseIdentifier);
  cell->_createSubviews();
  LayoutConstraint::activateConstraints(cell->_initialConstraints());
  return cell;
}

FontRef NBTransitItemFixedHeightCell::_primaryFont() {
  return preferredTableCellFont(TextStyle::headline, FontTraits::bold);
}

FontRef NBTransitItemFixedHeightCell::_secondaryFont() {
  return preferredTableCellFont(TextStyle::subheadline, FontTraits::none);
}

void NBTransitItemFixedHeightCell::_createSubviews() {
  const std::weak_ptr<Object> weakCell = weak_from_this();
  const FontProvider primaryFont = [weakCell] { return weakCell.expired() ? nullptr : _primaryFont(); };
  const FontProvider secondaryFont = [weakCell] { return weakCell.expired() ? nullptr : _secondaryFont(); };
  const auto vibrancyView = [](std::int64_t style) {
    auto view = std::make_shared<VisualEffectWrappingView>(VisualEffect::widgetEffectForVibrancyStyle(style));
    view->setUsesAutomaticConstraints(false);
    return view;
  };

  _contentGuide = std::make_shared<LayoutGuide>();
  _contentGuide->setLayoutName("contentGuide");
  addLayoutGuide(_contentGuide);

  _stackView = std::make_shared<StackView>();
  _stackView->setUsesAutomaticConstraints(false);
  _stackView->setBaselineRelativeArrangement(true);
  DynamicTypeWizard::autoscaleStackView_spacing_withFontProvider(_stackView, kBaselineSpacing, primaryFont);
  contentView()->addSubview(_stackView);

  _vibrancyViewForPrimaryLabel = vibrancyView(kPrimaryVibrancyStyle);
  _stackView->addArrangedSubview(_vibrancyViewForPrimaryLabel);
  _primaryLabel = std::make_shared<StyledLabel>();
  _primaryLabel->setLayoutName("primaryLabel");
  _primaryLabel->setNumberOfLines(0);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(_primaryLabel, primaryFont);
  _vibrancyViewForPrimaryLabel->setWrappedView(_primaryLabel);

  _vibrancyViewForSecondaryLabel = vibrancyView(kSecondaryVibrancyStyle);
  _stackView->addArrangedSubview(_vibrancyViewForSecondaryLabel);
  _secondaryLabel = std::make_shared<StyledLabel>();
  _secondaryLabel->setLayoutName("secondaryLabel");
  _secondaryLabel->setNumberOfLines(0);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(_secondaryLabel, secondaryFont);
  _vibrancyViewForSecondaryLabel->setWrappedView(_secondaryLabel);

  _trailingGutterGuide = std::make_shared<LayoutGuide>();
  _trailingGutterGuide->setLayoutName("trailingGutter");
  contentView()->addLayoutGuide(_trailingGutterGuide);

  _nonVibrantImageView = std::make_shared<ArtworkImageView>();
  _nonVibrantImageView->setLayoutName("nonVibrantShield");
  _nonVibrantImageView->setUsesAutomaticConstraints(false);
  contentView()->addSubview(_nonVibrantImageView);

  _vibrantImageView = vibrancyView(kSecondaryVibrancyStyle);
  _vibrantImageView->setLayoutName("vibrantShield");
  _vibrantImageView->setWrappedView(std::make_shared<ArtworkImageView>());
  contentView()->addSubview(_vibrantImageView);
}

std::vector<LayoutConstraintRef> NBTransitItemFixedHeightCell::_initialConstraints() {
  View& content = *contentView();
  LayoutGuide& guide = *_contentGuide;
  LayoutGuide& gutter = *_trailingGutterGuide;
  StackView& stack = *_stackView;
  View& shield = *_vibrantImageView;
  View& plainShield = *_nonVibrantImageView;

  _rowHeightConstraint = content.heightAnchor().constraintEqualToConstant(kInitialRowHeight);
  _trailingGutterGuideWidthConstraint = gutter.widthAnchor().constraintEqualToConstant(0.0);
  _primaryLabelToContentGuideConstraint =
      _primaryLabel->firstBaselineAnchor().constraintEqualToAnchor(guide.topAnchor());
  _primaryLabelToContentGuideConstraint->setPriority(kCapLinePriority);
  _updatePrimaryLabelToContentGuideConstaint();
  DynamicTypeWizard::makeObject_performSelector_whenSizeCategoryChangesWithOrder(shared_from_this(),
                                                                                 std::string(kUpdateOperation), 1);
  _stackViewToTrailingGuideConstraint = stack.trailingAnchor().constraintEqualToAnchor(gutter.leadingAnchor());
  _stackViewToContentGuideTrailingConstraint = stack.trailingAnchor().constraintEqualToAnchor(guide.trailingAnchor());

  return {
      _rowHeightConstraint,
      guide.centerYAnchor().constraintEqualToAnchor(content.centerYAnchor()),
      guide.leadingAnchor().constraintEqualToAnchor(content.leadingAnchor()),
      guide.trailingAnchor().constraintEqualToAnchor(content.trailingAnchor()),
      guide.topAnchor().constraintGreaterThanOrEqualToAnchor(content.topAnchor()),
      guide.bottomAnchor().constraintLessThanOrEqualToAnchor(content.bottomAnchor()),
      gutter.topAnchor().constraintEqualToAnchor(guide.topAnchor()),
      gutter.bottomAnchor().constraintEqualToAnchor(guide.bottomAnchor()),
      gutter.trailingAnchor().constraintEqualToAnchor(guide.trailingAnchor()),
      _trailingGutterGuideWidthConstraint,
      _primaryLabel->topAnchor().constraintGreaterThanOrEqualToAnchor(content.topAnchor()),
      _primaryLabelToContentGuideConstraint,
      guide.bottomAnchor().constraintEqualToAnchor(stack.lastBaselineAnchor()),
      stack.leadingAnchor().constraintEqualToAnchor(guide.leadingAnchor()),
      _stackViewToTrailingGuideConstraint,
      shield.trailingAnchor().constraintEqualToAnchor(gutter.trailingAnchor()),
      shield.centerYAnchor().constraintEqualToAnchor(guide.centerYAnchor()),
      shield.topAnchor().constraintGreaterThanOrEqualToAnchor(content.topAnchor(), kShieldMargin),
      shield.bottomAnchor().constraintLessThanOrEqualToAnchor(content.bottomAnchor(), -kShieldMargin),
      shield.leadingAnchor().constraintEqualToAnchor(plainShield.leadingAnchor()),
      shield.trailingAnchor().constraintEqualToAnchor(plainShield.trailingAnchor()),
      shield.topAnchor().constraintEqualToAnchor(plainShield.topAnchor()),
      shield.bottomAnchor().constraintEqualToAnchor(plainShield.bottomAnchor()),
  };
}

void NBTransitItemFixedHeightCell::_updatePrimaryLabelToContentGuideConstaint() {
  _primaryLabelToContentGuideConstraint->setConstant(roundToViewScale(_primaryLabel->font()->capHeight(), this));
}

void NBTransitItemFixedHeightCell::setTransitItem(NBTransitItemRef item) {
  if (absentOrEqual(item, _transitItem)) return;
  _transitItem = std::move(item);
  const std::optional<std::string> none;
  _primaryLabel->setText(_transitItem ? _transitItem->primaryText() : none);
  _secondaryLabel->setText(_transitItem ? _transitItem->secondaryText() : none);

  const NBConfiguredArtworkRef artwork = _transitItem ? _transitItem->artwork() : nullptr;
  const bool artworkHidden = _transitItem && _transitItem->isArtworkHidden();
  const double alpha = artwork ? artwork->alpha() : 0;
  auto& vibrant = static_cast<ArtworkImageView&>(*_vibrantImageView->wrappedView());
  ArtworkImageView& chosen = alpha < 1.0 ? vibrant : *_nonVibrantImageView;
  ArtworkImageView& other = alpha < 1.0 ? *_nonVibrantImageView : vibrant;
  other.setImageSource(nullptr);
  other.setAlpha(1.0);
  other.setHidden(true);
  chosen.setImageSource(artwork ? artwork->artworkSource() : nullptr);
  chosen.setAlpha(alpha);
  chosen.setHidden(artworkHidden);

  _secondaryLabel->setHidden(!_secondaryLabel->text());
  _stackViewToTrailingGuideConstraint->setActive(!artworkHidden);
  _stackViewToContentGuideTrailingConstraint->setActive(artworkHidden);
}

bool NBTransitItemFixedHeightCell::respondsToOperation(std::string_view name) const { return name == kUpdateOperation; }

void NBTransitItemFixedHeightCell::performOperation(std::string_view name) {
  if (name == kUpdateOperation) _updatePrimaryLabelToContentGuideConstaint();
}

}  // namespace nimbo
