#include "process/Snapshot.h"

#include <limits>

#include "desktop/rpc/Base64.h"
#include "handoff/NBUserActivityData.h"
#include "handoff/URL+NBOpenable.h"
#include "items/NBConfiguredArtwork.h"
#include "items/NBTransitSummaryItem.h"
#include "platform/artwork/NamedImage.h"
#include "platform/artwork/SizedTransitArtwork.h"
#include "process/Parameters.h"

namespace nimbo {

using nlohmann::json;

namespace {

json optionalText(const std::optional<std::string>& text) { return text ? json(*text) : json(); }

json iconJSON(const TransitIcon& icon) {
  return {{"iconType", icon.iconType},
          {"cartoID", icon.cartoID},
          {"defaultTransitType", icon.defaultTransitType},
          {"iconAttributeKey", icon.iconAttributeKey},
          {"iconAttributeValue", icon.iconAttributeValue}};
}

json shieldJSON(const TransitArtwork* artwork) {
  if (!artwork) return nullptr;
  const auto& shield = artwork->shieldDataSource();
  return {{"text", shield ? optionalText(shield->shieldText) : json()},
          {"color", shield ? optionalText(shield->shieldColorString) : json()},
          {"textColor", shield ? optionalText(shield->shieldTextColorString) : json()},
          {"type", shield ? shield->shieldType : 0},
          {"icon", artwork->iconDataSource() ? iconJSON(*artwork->iconDataSource()) : json()},
          {"accessibilityText", optionalText(artwork->accessibilityText())}};
}

json artworkJSON(const NBConfiguredArtwork* artwork) {
  if (!artwork) return nullptr;
  json result = {{"alpha", artwork->alpha()}};
  if (const auto* image = dynamic_cast<const NamedImage*>(artwork->artworkSource().get())) {
    result["image"] = image->name();
  } else if (const auto* sized = dynamic_cast<const SizedTransitArtwork*>(artwork->artworkSource().get())) {
    result["shield"] = shieldJSON(sized->artwork().get());
    result["size"] = sized->shieldSize();
  }
  return result;
}

json openableJSON(const NBOpenable* openable) {
  if (const auto* url = dynamic_cast<const NBURLOpenable*>(openable)) return {{"url", url->url().absoluteString()}};
  if (const auto* activity = dynamic_cast<const NBUserActivityData*>(openable))
    return {{"activityType", activity->activityType().value_or("")}};
  return nullptr;
}

json itemJSON(const Object* object) {
  if (const auto* item = dynamic_cast<const NBTransitItem*>(object))
    return {{"class", item->className()},
            {"primaryText", optionalText(item->primaryText())},
            {"secondaryText", optionalText(item->secondaryText())},
            {"artwork", artworkJSON(item->artwork().get())},
            {"artworkHidden", item->isArtworkHidden()},
            {"openable", openableJSON(item->openable().get())}};
  if (const auto* summary = dynamic_cast<const NBTransitSummaryItem*>(object)) {
    json shields = json::array();
    for (const auto& artwork : summary->artworks()) shields.push_back(shieldJSON(artwork.get()));
    return {{"class", summary->className()},
            {"primaryText", summary->primaryText()},
            {"artworks", shields},
            {"userActivityData", openableJSON(summary->userActivityData().get())}};
  }
  return nullptr;
}

json rectJSON(const Rect& rect) {
  const auto unsignedZero = [](double length) { return length + 0.0; };
  return {unsignedZero(rect.x), unsignedZero(rect.y), unsignedZero(rect.width), unsignedZero(rect.height)};
}

/// The views of a cell with their frames in the cell, depth first.
json viewsJSON(const View& view) {
  json views = json::array();
  for (const auto& subview : view.subviews())
    views.push_back({{"class", subview->className()},
                     {"frame", rectJSON(subview->frame())},
                     {"hidden", subview->isHidden()},
                     {"views", viewsJSON(*subview)}});
  return views;
}

json rowJSON(NBTransitIncidentsViewController& controller, IndexPath indexPath) {
  NBTransitIncidentDataSource& dataSource = *controller.dataSource();
  TableView& tableView = *controller.tableView();
  json row = itemJSON(dataSource._itemAtIndexPath(indexPath).get());
  if (row.is_null()) row = json::object();
  const auto cell = tableView.cellForRowAtIndexPath(indexPath);
  row["cell"] = cell->className();
  row["highlightable"] = dataSource.tableView_shouldHighlightRowAtIndexPath(tableView, indexPath);
  row["separatorStyleOverride"] = cell->separatorStyleOverride();
  Rect frame = tableView.rectForRowAtIndexPath(indexPath);
  frame.x += tableView.frame().x;
  frame.y += tableView.frame().y;
  row["frame"] = rectJSON(frame);
  row["views"] = viewsJSON(*cell);
  return row;
}

/// The result that the rows were built from: of the last fetch, or restored; null while there is neither.
json resultJSON(const ResultRef& result) {
  if (!result) return {{"result", nullptr}};
  json answer = {{"result", result->isSuccess() ? "success" : "error"}};
  result->withValue_orError(
      [](const ObjectRef&) {},
      [&](const ErrorRef& error) {
        answer["error"] = {{"domain", error->domain()}, {"code", error->code()}, {"reason", error->reason()}};
      });
  return answer;
}

}  // namespace

json userInfoJSON(const BoxedDictionary* userInfo) {
  json result = json::object();
  if (!userInfo) return result;
  for (const auto& [key, object] : userInfo->entries()) {
    if (const auto* data = dynamic_cast<const BoxedData*>(object.get()))
      result[key] = base64(data->value());
    else if (object)
      result[key] = base64(object->description());
  }
  return result;
}

json snapshotJSON(NBTransitIncidentsViewController& controller) {
  controller.view()->layoutIfNeeded();
  const NBTransitIncidentDataSource& dataSource = *controller.dataSource();
  const WidgetHost* host = controller.widgetHost();
  const bool limited = dataSource.maxNumberOfRows() != std::numeric_limits<std::uint64_t>::max();
  const Size preferred = controller.preferredContentSize();

  json rows = json::array();
  for (std::int64_t row = 0; row < controller.tableView()->numberOfRows(); ++row)
    rows.push_back(rowJSON(controller, {0, row}));

  json expandedItems = json::array();
  for (const auto& item : dataSource.listItem()->expandedItemsOrEmpty()) expandedItems.push_back(itemJSON(item.get()));

  json updateDates = json::array();
  if (controller.updater())
    for (const Date date : controller.updater()->updateDates()) updateDates.push_back(isoTextOfDate(date));

  json snapshot = {
      {"displayMode", nameOfDisplayMode(host ? host->activeDisplayMode() : WidgetDisplayMode::Compact)},
      {"expanded", dataSource.isExpanded()},
      {"visible", controller.isVisible()},
      {"rowHeight", dataSource.rowHeight()},
      {"maxNumberOfRows", limited ? json(dataSource.maxNumberOfRows()) : json()},
      {"artworkColumnWidth", dataSource.artworkColumnWidth()},
      {"preferredContentSize", host ? json{preferred.width, preferred.height} : json()},
      {"largestAvailableDisplayMode",
       nameOfDisplayMode(host ? host->largestAvailableDisplayMode() : WidgetDisplayMode::Compact)},
      {"rows", rows},
      {"listItem",
       {{"summaryItem", itemJSON(dataSource.listItem()->summaryItem().get())}, {"expandedItems", expandedItems}}},
      {"updateDates", updateDates}};
  snapshot.update(resultJSON(controller.transitLineItemResult()));
  return snapshot;
}

}  // namespace nimbo
