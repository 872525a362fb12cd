#include "items/NBTransitListItem.h"

#include <algorithm>

namespace nimbo {

NBTransitListItemRef NBTransitListItem::initWithSummaryItem_expandedItems(ObjectRef summaryItem,
                                                                          std::optional<NBTransitItems> expandedItems) {
  return std::make_shared<const NBTransitListItem>(std::move(summaryItem), std::move(expandedItems));
}

const NBTransitItems& NBTransitListItem::expandedItemsOrEmpty() const {
  static const NBTransitItems none;
  return _expandedItems ? *_expandedItems : none;
}

bool NBTransitListItem::isEqualToListItem(const NBTransitListItem& other) const {
  const NBTransitItems& mine = expandedItemsOrEmpty();
  const NBTransitItems& others = other.expandedItemsOrEmpty();
  return absentOrEqual(_summaryItem, other._summaryItem) &&
         _expandedItems.has_value() == other._expandedItems.has_value() &&
         std::ranges::equal(mine, others, absentOrEqual);
}

bool NBTransitListItem::isEqual(const Object* other) const {
  const auto* item = dynamic_cast<const NBTransitListItem*>(other);
  return item && isEqualToListItem(*item);
}

std::uint64_t NBTransitListItem::hash() const { return hashOf(_summaryItem) ^ expandedItemsOrEmpty().size(); }

}  // namespace nimbo
