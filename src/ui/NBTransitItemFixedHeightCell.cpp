#include "ui/NBTransitItemFixedHeightCell.h"

namespace nimbo {

namespace {

constexpr double kSpacingOfTexts = 21.0;
constexpr double kShieldMargin = 8.0;
constexpr LayoutPriority kCapLinePriority = 750;
constexpr std::int64_t kSecondaryVibrancyStyle = 102;

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
  const FontProvider primaryFont = providerOfFont(_primaryFont);
  createStack();
  DynamicTypeWizard::autoscaleStackView_spacing_withFontProvider(_stackView, kSpacingOfTexts, primaryFont);
  createPrimaryLabel(primaryFont, 0);

  _vibrancyViewForSecondaryLabel = vibrancyView(kSecondaryVibrancyStyle);
  _stackView->addArrangedSubview(_vibrancyViewForSecondaryLabel);
  _secondaryLabel = std::make_shared<StyledLabel>();
  _secondaryLabel->setLayoutName("secondaryLabel");
  _secondaryLabel->setNumberOfLines(0);
  DynamicTypeWizard::autorefreshLabel_withFontProvider(_secondaryLabel, providerOfFont(_secondaryFont));
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

  std::vector<LayoutConstraintRef> constraints = rowConstraints(_primaryLabel->firstBaselineAnchor());
  _primaryLabelToContentGuideConstraint->setPriority(kCapLinePriority);
  _trailingGutterGuideWidthConstraint = gutter.widthAnchor().constraintEqualToConstant(0.0);
  _stackViewToTrailingGuideConstraint = stack.trailingAnchor().constraintEqualToAnchor(gutter.leadingAnchor());
  _stackViewToContentGuideTrailingConstraint = stack.trailingAnchor().constraintEqualToAnchor(guide.trailingAnchor());

  constraints.insert(
      constraints.end(),
      {
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
      });
  return constraints;
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

}  // namespace nimbo
