#include "process/Snapshot.h"

#include <limits>

#include "desktop/rpc/Base64.h"
#include "handoff/NBOpenable.h"
#include "handoff/NBUserActivityData.h"
#include "items/NBConfiguredArtwork.h"
#include "items/NBTransitSummaryItem.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/artwork/ArtworkImageSource.h"

namespace nimbo {

namespace {

std::optional<protocol::Artwork> artworkOf(const NBConfiguredArtwork* artwork) {
  if (!artwork) return std::nullopt;
  protocol::Artwork result{.alpha = artwork->alpha()};
  if (const auto* image = dynamic_cast<const NamedImage*>(artwork->artworkSource().get())) {
    result.image = image->name();
  } else if (const auto* sized = dynamic_cast<const SizedTransitArtwork*>(artwork->artworkSource().get())) {
    if (sized->artwork()) result.shield = shieldOf(*sized->artwork());
    result.size = sized->shieldSize();
  }
  return result;
}

std::optional<protocol::Openable> openableOf(const NBOpenable* openable) {
  if (const auto* url = dynamic_cast<const NBURLOpenable*>(openable))
    return protocol::Openable{.url = url->url().absoluteString()};
  if (const auto* activity = dynamic_cast<const NBUserActivityData*>(openable))
    return protocol::Openable{.activityType = activity->activityType().value_or("")};
  return std::nullopt;
}

std::optional<protocol::Item> itemOf(const Object* object) {
  if (const auto* item = dynamic_cast<const NBTransitItem*>(object))
    return protocol::TransitItem{.primaryText = item->primaryText(),
                                 .secondaryText = item->secondaryText(),
                                 .artwork = artworkOf(item->artwork().get()),
                                 .artworkHidden = item->isArtworkHidden(),
                                 .openable = openableOf(item->openable().get())};
  if (const auto* summary = dynamic_cast<const NBTransitSummaryItem*>(object)) {
    protocol::SummaryItem result{.primaryText = summary->primaryText(),
                                 .userActivityData = openableOf(summary->userActivityData().get())};
    for (const auto& artwork : summary->artworks())
      if (artwork) result.artworks.push_back(shieldOf(*artwork));
    return result;
  }
  return std::nullopt;
}

/// The views of a cell with their frames in the cell, depth first.
std::vector<protocol::ViewNode> viewsOf(const View& view) {
  std::vector<protocol::ViewNode> views;
  for (const auto& subview : view.subviews())
    views.push_back({std::string(subview->className()), subview->frame(), subview->isHidden(), viewsOf(*subview)});
  return views;
}

protocol::Row rowOf(NBTransitIncidentsViewController& controller, IndexPath indexPath) {
  NBTransitIncidentDataSource& dataSource = *controller.dataSource();
  TableView& tableView = *controller.tableView();
  const auto cell = tableView.cellForRowAtIndexPath(indexPath);
  Rect frame = tableView.rectForRowAtIndexPath(indexPath);
  frame.x += tableView.frame().x;
  frame.y += tableView.frame().y;
  return {.item = itemOf(dataSource._itemAtIndexPath(indexPath).get()),
          .cell = std::string(cell->className()),
          .highlightable = dataSource.tableView_shouldHighlightRowAtIndexPath(tableView, indexPath),
          .separatorStyleOverride = cell->separatorStyleOverride(),
          .frame = frame,
          .views = viewsOf(*cell)};
}

/// The result that the rows were built from: of the last fetch, or restored; absent while there is neither.
void setResult(protocol::Snapshot& snapshot, const ResultRef& result) {
  if (!result) return;
  result->withValue_orError([&](const ObjectRef&) { snapshot.result = protocol::FetchResult::success; },
                            [&](const ErrorRef& error) {
                              snapshot.result = protocol::FetchResult::error;
                              snapshot.error = fetchErrorOf(*error);
                            });
}

}  // namespace

protocol::FetchError fetchErrorOf(const Error& error) {
  protocol::FetchError result{error.domain(), error.code(), error.reason(), std::nullopt, std::nullopt};
  if (!error.subject().empty()) result.subject = error.subject();
  if (!error.feed().empty()) result.feed = error.feed();
  return result;
}

protocol::Shield shieldOf(const TransitArtwork& artwork) {
  protocol::Shield result;
  if (const auto& shield = artwork.shieldDataSource()) {
    result.text = shield->shieldText;
    result.color = shield->shieldColorString;
    result.textColor = shield->shieldTextColorString;
    result.type = shield->shieldType;
  }
  if (const auto& icon = artwork.iconDataSource())
    result.icon = protocol::Icon{icon->iconType, icon->cartoID, icon->defaultTransitType, icon->iconAttributeKey,
                                 icon->iconAttributeValue};
  result.accessibilityText = artwork.accessibilityText();
  return result;
}

std::map<std::string, std::string> writtenUserInfo(const BoxedDictionary* userInfo) {
  std::map<std::string, std::string> result;
  if (!userInfo) return result;
  for (const auto& [key, object] : userInfo->entries()) {
    if (const auto* data = dynamic_cast<const BoxedData*>(object.get()))
      result[key] = base64(data->value());
    else if (object)
      result[key] = base64(object->description());
  }
  return result;
}

protocol::Snapshot snapshotOf(NBTransitIncidentsViewController& controller, bool withRows) {
  const NBTransitIncidentDataSource& dataSource = *controller.dataSource();
  const WidgetHost* host = controller.widgetHost();
  protocol::Snapshot snapshot{
      .displayMode = host ? host->activeDisplayMode() : WidgetDisplayMode::Compact,
      .expanded = dataSource.isExpanded(),
      .visible = controller.isVisible(),
      .rowHeight = dataSource.rowHeight(),
      .largestAvailableDisplayMode = host ? host->largestAvailableDisplayMode() : WidgetDisplayMode::Compact,
      .listItem = {.summaryItem = itemOf(dataSource.listItem()->summaryItem().get())}};
  if (host) snapshot.preferredContentSize = controller.preferredContentSize();
  if (dataSource.maxNumberOfRows() != std::numeric_limits<std::uint64_t>::max())
    snapshot.maxNumberOfRows = dataSource.maxNumberOfRows();
  setResult(snapshot, controller.transitLineItemResult());
  if (withRows) {
    controller.view()->layoutIfNeeded();
    snapshot.artworkColumnWidth = dataSource.artworkColumnWidth();
    for (std::int64_t row = 0; row < controller.tableView()->numberOfRows(); ++row)
      snapshot.rows.push_back(rowOf(controller, {0, row}));
  }
  for (const auto& item : dataSource.listItem()->expandedItemsOrEmpty())
    if (auto written = itemOf(item.get())) snapshot.listItem.expandedItems.push_back(*std::move(written));
  if (controller.updater()) {
    const std::set<Date> dates = controller.updater()->updateDates();
    snapshot.updateDates.assign(dates.begin(), dates.end());
  }
  return snapshot;
}

}  // namespace nimbo
