#include "incidents/NBTransitIncidentUpdater.h"

#include "platform/Platform.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

/// Share of the refresh interval by which a refresh may be late, to go with other wake-ups of the machine.
constexpr double kAutoRefreshTolerance = 0.1;

ObjectRef boxedDates(const std::set<Date>& dates) {
  std::vector<ObjectRef> boxed;
  boxed.reserve(dates.size());
  for (const Date date : dates) boxed.push_back(box(date));
  return std::make_shared<const BoxedArray>(std::move(boxed));
}

}  // namespace

std::shared_ptr<NBTransitIncidentUpdater> NBTransitIncidentUpdater::initWithTransitLineItems_refreshInterval(
    TransitLineItems lineItems, TimeInterval refreshInterval) {
  auto updater = std::make_shared<NBTransitIncidentUpdater>(std::move(lineItems), refreshInterval);
  writeLog(NBTransitWidgetLogFacility, LogLevel::debug,
           "Incident updater calculated update dates for incidents: %{private}@", {boxedDates(updater->_dates)});
  updater->_scheduleAutoRefreshTimer();
  updater->_schedulateNextUpdate();
  return updater;
}

NBTransitIncidentUpdater::NBTransitIncidentUpdater(TransitLineItems lineItems, TimeInterval refreshInterval)
    : _lineItems(std::move(lineItems)), _refreshInterval(refreshInterval) {
  _dates = _calculateUpdateDatesForIncidents();
}

NBTransitIncidentUpdater::~NBTransitIncidentUpdater() { invalidate(); }

std::shared_ptr<NBTransitIncidentUpdater> NBTransitIncidentUpdater::self() {
  return std::static_pointer_cast<NBTransitIncidentUpdater>(shared_from_this());
}

void NBTransitIncidentUpdater::invalidate() {
  for (const auto& timer : {_autoRefreshTimer, _updateTimer})
    if (timer) timer->invalidate();
}

std::set<Date> NBTransitIncidentUpdater::_calculateUpdateDatesForIncidents() const {
  const Date now = currentDate();
  std::set<Date> dates;
  for (const TransitLineItemRef& lineItem : _lineItems) {
    for (const TransitIncidentRef& incident : lineItem->incidents()) {
      const std::optional<Date> start = incident->startDate();
      const std::optional<Date> end = incident->endDate();
      const bool startsLater = start && *start > now;
      if (startsLater) dates.insert(*start);
      // The end of an incident that is still to start counts wherever it lies.
      if (end && (startsLater || *end > now)) dates.insert(*end);
    }
  }
  return dates;
}

void NBTransitIncidentUpdater::_scheduleAutoRefreshTimer() {
  if (_autoRefreshTimer && _autoRefreshTimer->isValid()) _autoRefreshTimer->invalidate();
  writeLog(NBTransitWidgetLogFacility, LogLevel::debug,
           "Scheduling incident updater  auto refresh update with interval %.2f", {_refreshInterval});
  _autoRefreshTimer = Platform::current().mainRunLoop().scheduleTimer(
      _refreshInterval, true, [self = self()](Timer& timer) { self->_autoRefreshTimerFired(timer); });
  _autoRefreshTimer->setTolerance(kAutoRefreshTolerance * _refreshInterval);
}

void NBTransitIncidentUpdater::_schedulateNextUpdate() {
  if (_dates.empty()) return;
  const TimeInterval interval = intervalFromNow(*_dates.begin());
  if (!(interval > 0)) return;
  _updateTimer = Platform::current().mainRunLoop().scheduleTimer(
      interval, false, [self = self()](Timer& timer) { self->_nextUpdateTimerFired(timer); });
}

void NBTransitIncidentUpdater::_nextUpdateTimerFired(Timer&) {
  Date date = currentDate();
  if (_dates.empty()) {
    writeLog(NBTransitWidgetLogFacility, LogLevel::error,
             "Incident updater next update date timer fired but we should not have any update anymore.");
  } else {
    date = *_dates.begin();
    writeLog(NBTransitWidgetLogFacility, LogLevel::debug, "Incident updater next update date was reached: %{private}@.",
             {box(date)});
    _dates.erase(_dates.begin());
    _schedulateNextUpdate();
  }
  if (const auto observer = _observer.lock()) observer->transitIncidentUpdater_dateExpired(*this, date);
}

void NBTransitIncidentUpdater::_autoRefreshTimerFired(Timer&) {
  writeLog(NBTransitWidgetLogFacility, LogLevel::debug, "Incident updater auto-refresh timer fired.");
  if (const auto observer = _observer.lock()) observer->transitIncidentUpdaterNeedsRefresh(*this);
}

}  // namespace nimbo
