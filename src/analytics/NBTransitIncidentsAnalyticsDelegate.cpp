#include "analytics/NBTransitIncidentsAnalyticsDelegate.h"

#include "platform/Platform.h"
#include "platform/transit/IncidentStringProvider.h"
#include "platform/ui/ViewController.h"

namespace nimbo {

namespace {

// The pipeline's codes.
constexpr int kWidgetTypeTransit = 2;
constexpr int kEndStateOpened = 1;
constexpr int kEndStateSwiped = 2;
constexpr int kMessageTypeNoLines = 1;

bool deviceIsLocked() {
  DeviceLockState& lockState = Platform::current().deviceLockState();
  return lockState.getDeviceLockState() == 1 || lockState.getDeviceLockState() == 2;
}

}  // namespace

std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>
NBTransitIncidentsAnalyticsDelegate::initWithTransitIncidentsViewController(std::weak_ptr<ViewController> controller) {
  return std::make_shared<NBTransitIncidentsAnalyticsDelegate>(std::move(controller));
}

bool NBTransitIncidentsAnalyticsDelegate::isExpanded() const {
  const auto controller = _transitIncidentsViewController.lock();
  const WidgetHost* host = controller ? controller->widgetHost() : nullptr;
  return host && host->activeDisplayMode() == WidgetDisplayMode::Expanded;
}

void NBTransitIncidentsAnalyticsDelegate::startSessionIfNeeded() {
  if (!_sessionStartDate) _sessionStartDate = currentDate();
  _analyticsData.emplace();
  _analyticsData->initiallyExpanded = isExpanded();
  _analyticsData->everExpanded = _analyticsData->initiallyExpanded;
}

void NBTransitIncidentsAnalyticsDelegate::recordCloseSessionSwiping() { _closeSessionWithEndState(kEndStateSwiped); }

void NBTransitIncidentsAnalyticsDelegate::recordWidgetChangeDisplayMode(WidgetDisplayMode mode) {
  if (!_sessionStartDate) return;
  if (mode == WidgetDisplayMode::Expanded) _analyticsData->everExpanded = true;
  Platform::current().analytics().captureUserAction(
      mode == WidgetDisplayMode::Compact ? kAnalyticsActionCollapse : kAnalyticsActionExpand,
      kAnalyticsTargetTransitWidget, std::nullopt);
}

int NBTransitIncidentsAnalyticsDelegate::_messageTypeForIncidentCount(std::size_t count) {
  if (count == 0) return 2;
  return count == 1 ? 3 : 4;
}

void NBTransitIncidentsAnalyticsDelegate::recordInfoForLines_incidentDisplayed_incidentsToLineMapping(
    const TransitLineItems& lines, const TransitIncidents& incidents, const TransitIncidentToLineMap& incidentsToLine) {
  if (!_analyticsData) return;
  _analyticsData->transitMessageType =
      lines.empty() ? kMessageTypeNoLines : _messageTypeForIncidentCount(incidents.size());
  for (const TransitIncidentRef& incident : incidents) {
    const auto line = incidentsToLine.find(incident);
    const std::uint64_t muid = line == incidentsToLine.end() ? 0 : line->second->muid();
    _analyticsData->addTransitIncidentItem(
        {std::to_string(muid), IncidentStringProvider::cellTitleForIncident(incident.get())});
  }
}

void NBTransitIncidentsAnalyticsDelegate::recordOpenItemAtIndexPath(IndexPath indexPath) {
  if (_analyticsData) {
    const std::int64_t firstRow = isExpanded() ? 1 : 0;
    _analyticsData->tappedItemIndex = indexPath.row == 0 ? firstRow : indexPath.row;
  }
  Platform::current().analytics().captureUserAction(kAnalyticsActionOpenItem, kAnalyticsTargetTransitWidget,
                                                    std::nullopt);
  _closeSessionWithEndState(kEndStateOpened);
}

void NBTransitIncidentsAnalyticsDelegate::_closeSessionWithEndState(int endState) {
  if (_sessionStartDate) {
    const bool wasLocked = deviceIsLocked();
    Platform::current().analytics().captureWidgetInteraction(kWidgetTypeTransit, endState, *_analyticsData, wasLocked,
                                                             *_sessionStartDate,
                                                             intervalBetween(*_sessionStartDate, currentDate()));
  }
  _sessionStartDate.reset();
  _analyticsData.reset();
}

}  // namespace nimbo
