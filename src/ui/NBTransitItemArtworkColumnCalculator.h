#pragma once

#include <functional>
#include <memory>
#include <optional>

#include "items/NBTransitItem.h"
#include "ui/TransitDirectionsListArtworkWidthCalculator.h"

namespace nimbo {

/// Fits the shields of a list of rows into one column, and remembers its last answer. Main thread only.
class NBTransitItemArtworkColumnCalculator final : public Object {
 public:
  /// The row to show in place of one whose shield had to shrink; null keeps the row.
  using DownSizingBlock = std::function<NBTransitItemRef(const NBTransitItemRef&, const SizedTransitArtworkRef&)>;

  /// The rows to show. Rows without a sized shield come back as they are. The width in points is written to
  /// `outArtworkColumnWidth` unless it is null. Of several rows with equal shields only the last gets the smaller one.
  /// Equal rows and an equal budget give the last answer again; `downSizingBlock`, which may be empty, is not called.
  NBTransitItems itemsFromItems_sizeParameter_outArtworkColumnWidth_downSizingBlock(
      const NBTransitItems& items, const ArtworkWidthCalculatorSizeParameter& sizeParameter,
      double* outArtworkColumnWidth, const DownSizingBlock& downSizingBlock);

  /// The rows of the last computation, as they were given; absent before the first.
  const std::optional<NBTransitItems>& cachedOriginalItems() const { return _cachedOriginalItems; }
  /// What the last computation answered; absent before the first.
  const std::optional<NBTransitItems>& cachedItemsForPreviousWidth() const { return _cachedItemsForPreviousWidth; }

  std::string_view className() const override { return "NBTransitItemArtworkColumnCalculator"; }

 private:
  NBTransitItems _itemsFromItems_sizeParameter_outArtworkColumnWidth_downSizingBlock(
      const NBTransitItems& items, const ArtworkWidthCalculatorSizeParameter& sizeParameter,
      double* outArtworkColumnWidth, const DownSizingBlock& downSizingBlock);

  ArtworkWidthCalculatorSizeParameter _previousSizeParameter;
  double _cachedArtworkColumnWidthForPreviousWidth = 0;
  std::optional<NBTransitItems> _cachedOriginalItems;
  std::optional<NBTransitItems> _cachedItemsForPreviousWidth;
};

}  // namespace nimbo
