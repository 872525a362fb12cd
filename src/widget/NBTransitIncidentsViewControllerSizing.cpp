// What the host's modes and sizes and the user's text size mean for the rows, and what the rows mean for the host.

#include <cmath>
#include <limits>

#include "widget/NBTransitIncidentsViewController.h"
#include "widget/NBTransitListItem+DisplayMode.h"

namespace nimbo {

WidgetDisplayMode widgetLargestAvailableDisplayMode(const NBTransitListItem& listItem) {
  return listItem.hasExpandedItems() ? WidgetDisplayMode::Expanded : WidgetDisplayMode::Compact;
}

std::uint64_t NBTransitIncidentsViewController::_maxNumberOfRowsFromAvailableWidgetSize() const {
  constexpr std::uint64_t kNoLimit = std::numeric_limits<std::uint64_t>::max();
  if (!widgetHost()) return kNoLimit;
  const double compact = widgetHost()->maximumSizeForDisplayMode(WidgetDisplayMode::Compact).height;
  const double expanded = widgetHost()->maximumSizeForDisplayMode(WidgetDisplayMode::Expanded).height;
  if (!(compact > 0)) return kNoLimit;
  const double rows = std::floor(expanded / compact);
  if (!(rows >= 1)) return kNoLimit;
  return rows < 0x1p64 ? static_cast<std::uint64_t>(rows) : kNoLimit;
}

double NBTransitIncidentsViewController::_availablWidth() {
  return widgetHost() ? widgetHost()->maximumSizeForDisplayMode(WidgetDisplayMode::Compact).width
                      : view()->bounds().width;
}

void NBTransitIncidentsViewController::_contentSizeCategoryDidChange() {
  const double rowHeight =
      widgetHost() ? widgetHost()->maximumSizeForDisplayMode(WidgetDisplayMode::Compact).height : 0;
  _dataSource->setRowHeight_maxNumberOfRows(rowHeight, _maxNumberOfRowsFromAvailableWidgetSize());
}

void NBTransitIncidentsViewController::widgetActiveDisplayModeDidChange_withMaximumSize(WidgetDisplayMode mode,
                                                                                        Size /*maximumSize*/) {
  _analyticsDelegate->recordWidgetChangeDisplayMode(mode);
  _dataSource->setExpanded(widgetHost() && widgetHost()->activeDisplayMode() == WidgetDisplayMode::Expanded);
}

void NBTransitIncidentsViewController::viewWillTransitionToSize_withTransitionCoordinator(
    Size size, TransitionCoordinator* coordinator) {
  ViewController::viewWillTransitionToSize_withTransitionCoordinator(size, coordinator);
  _dataSource->setAvailableWidth(size.width);
}

void NBTransitIncidentsViewController::updateLargestAvailableDisplayMode() {
  if (widgetHost())
    widgetHost()->setLargestAvailableDisplayMode(widgetLargestAvailableDisplayMode(*_dataSource->listItem()));
}

void NBTransitIncidentsViewController::dataSourceDidUpdateContent(NBTransitIncidentDataSource&) {
  updateLargestAvailableDisplayMode();
  const Size maximumSize =
      widgetHost() ? widgetHost()->maximumSizeForDisplayMode(widgetHost()->activeDisplayMode()) : Size{};
  const Size size = _dataSource->preferredContentSizeForExpanded_maxSize(_dataSource->isExpanded(), maximumSize);
  _tableView->reloadSection_withRowAnimation(0, TableRowAnimation::automatic);
  setPreferredContentSize(size);
}

}  // namespace nimbo
