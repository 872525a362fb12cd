#pragma once

#include <memory>
#include <string>
#include <vector>

#include "items/NBTransitItem.h"
#include "platform/ui/ArtworkImageView.h"
#include "ui/NBTransitRowCell.h"

namespace nimbo {

/// A row of a fixed height: a title and a second text, and a shield in the trailing column.
class NBTransitItemFixedHeightCell final : public NBTransitRowCell {
 public:
  static std::shared_ptr<NBTransitItemFixedHeightCell> initWithStyle_reuseIdentifier(
      TableCellStyle style, const std::string& reuseIdentifier);
  using NBTransitRowCell::NBTransitRowCell;

  const NBTransitItemRef& transitItem() const { return _transitItem; }
  /// Null empties the row; an equal item changes nothing.
  void setTransitItem(NBTransitItemRef item);

  /// Points; 0 until set.
  double trailingArtworkColumnWidth() const { return _trailingGutterGuideWidthConstraint->constant(); }
  void setTrailingArtworkColumnWidth(double width) { _trailingGutterGuideWidthConstraint->setConstant(width); }

  const std::shared_ptr<StyledLabel>& secondaryLabel() const { return _secondaryLabel; }

  std::string_view className() const override { return "NBTransitItemFixedHeightCell"; }

 private:
  static FontRef _primaryFont();
  static FontRef _secondaryFont();
  void _createSubviews();
  std::vector<LayoutConstraintRef> _initialConstraints();

  std::shared_ptr<VisualEffectWrappingView> _vibrancyViewForSecondaryLabel;
  std::shared_ptr<VisualEffectWrappingView> _vibrantImageView;
  std::shared_ptr<ArtworkImageView> _nonVibrantImageView;
  LayoutConstraintRef _stackViewToTrailingGuideConstraint;
  LayoutConstraintRef _stackViewToContentGuideTrailingConstraint;
  std::shared_ptr<LayoutGuide> _trailingGutterGuide;
  LayoutConstraintRef _trailingGutterGuideWidthConstraint;
  std::shared_ptr<StyledLabel> _secondaryLabel;
  NBTransitItemRef _transitItem;
};

}  // namespace nimbo
