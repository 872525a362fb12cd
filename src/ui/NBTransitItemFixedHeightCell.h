#pragma once

#include <memory>
#include <string>
#include <vector>

#include "items/NBTransitItem.h"
#include "platform/ui/ArtworkImageView.h"
#include "platform/ui/StackView.h"
#include "platform/ui/StyledLabel.h"
#include "platform/ui/StyledTableCell.h"
#include "ui/VisualEffectWrappingView.h"

namespace nimbo {

/// A row of a fixed height: a title and a second text, and a shield in the trailing column.
class NBTransitItemFixedHeightCell final : public StyledTableCell {
 public:
  static std::shared_ptr<NBTransitItemFixedHeightCell> initWithStyle_reuseIdentifier(
      TableCellStyle style, const std::string& reuseIdentifier);
  using StyledTableCell::StyledTableCell;

  const NBTransitItemRef& transitItem() const { return _transitItem; }
  /// Null empties the row; an equal item changes nothing.
  void setTransitItem(NBTransitItemRef item);

  /// Points; 110 until set.
  double rowHeight() const { return _rowHeightConstraint->constant(); }
  void setRowHeight(double height) { _rowHeightConstraint->setConstant(height); }
  /// Points; 0 until set.
  double trailingArtworkColumnWidth() const { return _trailingGutterGuideWidthConstraint->constant(); }
  void setTrailingArtworkColumnWidth(double width) { _trailingGutterGuideWidthConstraint->setConstant(width); }

  const std::shared_ptr<StyledLabel>& primaryLabel() const { return _primaryLabel; }
  const std::shared_ptr<StyledLabel>& secondaryLabel() const { return _secondaryLabel; }

  bool respondsToOperation(std::string_view name) const override;
  void performOperation(std::string_view name) override;
  std::string_view className() const override { return "NBTransitItemFixedHeightCell"; }

 private:
  static FontRef _primaryFont();
  static FontRef _secondaryFont();
  void _createSubviews();
  std::vector<LayoutConstraintRef> _initialConstraints();
  void _updatePrimaryLabelToContentGuideConstaint();

  std::shared_ptr<StackView> _stackView;
  std::shared_ptr<LayoutGuide> _contentGuide;
  std::shared_ptr<VisualEffectWrappingView> _vibrancyViewForPrimaryLabel;
  std::shared_ptr<VisualEffectWrappingView> _vibrancyViewForSecondaryLabel;
  std::shared_ptr<VisualEffectWrappingView> _vibrantImageView;
  std::shared_ptr<ArtworkImageView> _nonVibrantImageView;
  LayoutConstraintRef _stackViewToTrailingGuideConstraint;
  LayoutConstraintRef _stackViewToContentGuideTrailingConstraint;
  std::shared_ptr<LayoutGuide> _trailingGutterGuide;
  LayoutConstraintRef _trailingGutterGuideWidthConstraint;
  LayoutConstraintRef _rowHeightConstraint;
  LayoutConstraintRef _primaryLabelToContentGuideConstraint;
  std::shared_ptr<StyledLabel> _primaryLabel;
  std::shared_ptr<StyledLabel> _secondaryLabel;
  NBTransitItemRef _transitItem;
};

}  // namespace nimbo
