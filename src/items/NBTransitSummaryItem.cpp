#include "items/NBTransitSummaryItem.h"

#include <algorithm>

#include "platform/foundation/Hash.h"

namespace nimbo {

NBTransitSummaryItemRef NBTransitSummaryItem::initWithText_artworks_userActivityData(
    std::string text, TransitArtworks artworks, NBUserActivityDataRef userActivityData) {
  return std::make_shared<const NBTransitSummaryItem>(std::move(text), std::move(artworks),
                                                      std::move(userActivityData));
}

bool NBTransitSummaryItem::isEqualToSummaryItem(const NBTransitSummaryItem& other) const {
  return _primaryText == other._primaryText && absentOrEqual(_userActivityData, other._userActivityData) &&
         std::equal(_artworks.begin(), _artworks.end(), other._artworks.begin(), other._artworks.end(),
                    [](const auto& a, const auto& b) { return artworksAreEquivalent(a.get(), b.get()); });
}

bool NBTransitSummaryItem::isEqual(const Object* other) const {
  const auto* item = dynamic_cast<const NBTransitSummaryItem*>(other);
  return item && isEqualToSummaryItem(*item);
}

std::uint64_t NBTransitSummaryItem::hash() const {
  return hashOfBytes(_primaryText) ^ _artworks.size() ^ hashOf(_userActivityData);
}

}  // namespace nimbo
