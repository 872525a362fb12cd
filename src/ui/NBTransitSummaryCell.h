#pragma once

#include <memory>
#include <string>
#include <vector>

#include "items/NBTransitSummaryItem.h"
#include "platform/ui/TransitInfoLabelView.h"
#include "ui/NBTransitRowCell.h"

namespace nimbo {

/// The compact row of several incidents: a text over one line of shields, which ends with the count of those that do
/// not fit.
class NBTransitSummaryCell final : public NBTransitRowCell {
 public:
  static std::shared_ptr<NBTransitSummaryCell> initWithStyle_reuseIdentifier(TableCellStyle style,
                                                                             const std::string& reuseIdentifier);
  using NBTransitRowCell::NBTransitRowCell;

  const NBTransitSummaryItemRef& item() const { return _item; }
  /// Null empties the row; an equal item changes nothing.
  void setItem(NBTransitSummaryItemRef item);

  /// Draws the shields.
  const std::shared_ptr<ArtworkCache>& artworkCache() const { return _artworksLabel->artworkCache(); }
  void setArtworkCache(std::shared_ptr<ArtworkCache> cache) { _artworksLabel->setArtworkCache(std::move(cache)); }

  const std::shared_ptr<TransitInfoLabelView>& artworksLabel() const { return _artworksLabel; }

  void layoutSubviews() override;
  /// Lays the cell out first: how tall the shields are depends on how many fit.
  Size systemLayoutSizeFittingSize_withHorizontalFittingPriority_verticalFittingPriority(
      Size size, LayoutPriority horizontalFittingPriority, LayoutPriority verticalFittingPriority) override;

  std::string_view className() const override { return "NBTransitSummaryCell"; }

 private:
  static FontRef _primaryFont();
  void _createSubviews();
  std::vector<LayoutConstraintRef> _initialConstraints();
  void _updateLayout();

  std::shared_ptr<TransitInfoLabelView> _artworksLabel;
  NBTransitSummaryItemRef _item;
};

}  // namespace nimbo
