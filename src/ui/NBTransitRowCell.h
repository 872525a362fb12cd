#pragma once

#include <memory>
#include <string_view>
#include <vector>

#include "platform/ui/StackView.h"
#include "platform/ui/StyledLabel.h"
#include "platform/ui/StyledTableCell.h"
#include "ui/DynamicTypeWizard.h"
#include "ui/VisualEffectWrappingView.h"

namespace nimbo {

/// What the rows of the widget have in common: a fixed height, and a stack with the primary text at its top, in a guide
/// from the text's cap line down that is centred in the row.
class NBTransitRowCell : public StyledTableCell {
 public:
  using StyledTableCell::StyledTableCell;

  /// Points; 110 until set.
  double rowHeight() const { return _rowHeightConstraint->constant(); }
  void setRowHeight(double height) { _rowHeightConstraint->setConstant(height); }

  const std::shared_ptr<StyledLabel>& primaryLabel() const { return _primaryLabel; }

  bool respondsToOperation(std::string_view name) const override;
  void performOperation(std::string_view name) override;

 protected:
  /// Makes the guide and the empty stack.
  void createStack();
  /// Makes the primary label of this many lines at most (0: any number), behind its vibrancy, as the next in the stack.
  void createPrimaryLabel(FontProvider font, std::int64_t numberOfLines);
  /// The constraints of the row and its guide. Makes also the one that puts `firstBaseline` a cap height below the
  /// guide's top, which is not among them, and keeps it up with the text size.
  std::vector<LayoutConstraintRef> rowConstraints(const LayoutAnchor& firstBaseline);
  void _updatePrimaryLabelToContentGuideConstaint();

  /// Answers `font()` for as long as the cell lives, null afterwards.
  FontProvider providerOfFont(FontRef (*font)());
  /// A view behind a vibrancy effect of the host, laid out by constraints.
  static std::shared_ptr<VisualEffectWrappingView> vibrancyView(std::int64_t style);

  std::shared_ptr<StackView> _stackView;
  std::shared_ptr<LayoutGuide> _contentGuide;
  std::shared_ptr<VisualEffectWrappingView> _vibrancyViewForPrimaryLabel;
  LayoutConstraintRef _rowHeightConstraint;
  LayoutConstraintRef _primaryLabelToContentGuideConstraint;
  std::shared_ptr<StyledLabel> _primaryLabel;
};

}  // namespace nimbo
