#include "ui/NBTransitItemArtworkColumnCalculator.h"

#include <algorithm>

#include "util/NimboMap.h"

namespace nimbo {

NBTransitItems NBTransitItemArtworkColumnCalculator::itemsFromItems_sizeParameter_outArtworkColumnWidth_downSizingBlock(
    const NBTransitItems& items, const ArtworkWidthCalculatorSizeParameter& sizeParameter,
    double* outArtworkColumnWidth, const DownSizingBlock& downSizingBlock) {
  const bool isSameAsLast = _cachedOriginalItems && sizeParameter == _previousSizeParameter &&
                            std::ranges::equal(items, *_cachedOriginalItems, absentOrEqual);
  if (!isSameAsLast)
    return _itemsFromItems_sizeParameter_outArtworkColumnWidth_downSizingBlock(items, sizeParameter,
                                                                               outArtworkColumnWidth, downSizingBlock);
  if (outArtworkColumnWidth) *outArtworkColumnWidth = _cachedArtworkColumnWidthForPreviousWidth;
  return *_cachedItemsForPreviousWidth;
}

NBTransitItems
NBTransitItemArtworkColumnCalculator::_itemsFromItems_sizeParameter_outArtworkColumnWidth_downSizingBlock(
    const NBTransitItems& items, const ArtworkWidthCalculatorSizeParameter& sizeParameter,
    double* outArtworkColumnWidth, const DownSizingBlock& downSizingBlock) {
  SizedTransitArtworkMap<std::size_t> positions;
  auto shields = NimboMap(items, [&](const NBTransitItemRef& item, std::size_t position) {
    auto shield = item->artwork()
                      ? std::dynamic_pointer_cast<const SizedTransitArtwork>(item->artwork()->artworkSource())
                      : nullptr;
    if (shield) positions[shield] = position;
    return shield;
  });
  const auto replacements = TransitDirectionsListArtworkWidthCalculator::initWithSizedArtworks_sizeParameter(
                                std::move(shields), sizeParameter)
                                ->calculateArtworkViewWidthAndArtworkSizes(&_cachedArtworkColumnWidthForPreviousWidth);
  NBTransitItems answer = items;
  for (const auto& [shield, replacement] : replacements) {
    const auto position = positions.find(shield);
    if (position == positions.end() || position->second >= answer.size() || !downSizingBlock) continue;
    NBTransitItemRef& item = answer[position->second];
    if (auto smaller = downSizingBlock(item, replacement)) item = std::move(smaller);
  }
  _cachedItemsForPreviousWidth = answer;
  _cachedOriginalItems = items;
  _previousSizeParameter = sizeParameter;
  if (outArtworkColumnWidth) *outArtworkColumnWidth = _cachedArtworkColumnWidthForPreviousWidth;
  return answer;
}

}  // namespace nimbo
