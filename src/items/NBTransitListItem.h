#pragma once

#include <memory>
#include <optional>

#include "items/NBTransitItem.h"

namespace nimbo {

/// Everything that the widget shows at one moment. Immutable. Equal when both fields are, however deep.
class NBTransitListItem : public Object {
 public:
  /// The summary item is an `NBTransitItem` or an `NBTransitSummaryItem`.
  static std::shared_ptr<const NBTransitListItem> initWithSummaryItem_expandedItems(
      ObjectRef summaryItem, std::optional<NBTransitItems> expandedItems);
  NBTransitListItem(ObjectRef summaryItem, std::optional<NBTransitItems> expandedItems)
      : _summaryItem(std::move(summaryItem)), _expandedItems(std::move(expandedItems)) {}

  /// The row of the compact mode.
  const ObjectRef& summaryItem() const { return _summaryItem; }
  /// The rows of the expanded mode in their order. Absent is not equal to empty; the builders give none absent.
  const std::optional<NBTransitItems>& expandedItems() const { return _expandedItems; }

  const NBTransitItems& expandedItemsOrEmpty() const;
  bool hasExpandedItems() const { return !expandedItemsOrEmpty().empty(); }

  bool isEqualToListItem(const NBTransitListItem& other) const;

  std::string_view className() const override { return "NBTransitListItem"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;

 private:
  ObjectRef _summaryItem;
  std::optional<NBTransitItems> _expandedItems;
};

using NBTransitListItemRef = std::shared_ptr<const NBTransitListItem>;

}  // namespace nimbo
