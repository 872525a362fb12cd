#pragma once

#include <memory>
#include <string>
#include <vector>

#include "handoff/NBUserActivityData.h"
#include "platform/transit/TransitArtwork.h"

namespace nimbo {

/// Shields or symbols in the order in which they are shown; none is null.
using TransitArtworks = std::vector<TransitArtworkRef>;

/// The compact row of several incidents: a text over the shields of all affected lines. Immutable. Equal when every
/// field is, the shields one by one in their order.
class NBTransitSummaryItem : public Object {
 public:
  /// `userActivityData` may be null.
  static std::shared_ptr<const NBTransitSummaryItem> initWithText_artworks_userActivityData(
      std::string text, TransitArtworks artworks, NBUserActivityDataRef userActivityData);
  NBTransitSummaryItem(std::string text, TransitArtworks artworks, NBUserActivityDataRef userActivityData)
      : _primaryText(std::move(text)), _artworks(std::move(artworks)), _userActivityData(std::move(userActivityData)) {}

  const std::string& primaryText() const { return _primaryText; }
  const TransitArtworks& artworks() const { return _artworks; }
  /// What a tap opens, or null.
  const NBUserActivityDataRef& userActivityData() const { return _userActivityData; }

  bool isEqualToSummaryItem(const NBTransitSummaryItem& other) const;

  std::string_view className() const override { return "NBTransitSummaryItem"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;

 private:
  std::string _primaryText;
  TransitArtworks _artworks;
  NBUserActivityDataRef _userActivityData;
};

using NBTransitSummaryItemRef = std::shared_ptr<const NBTransitSummaryItem>;

}  // namespace nimbo
