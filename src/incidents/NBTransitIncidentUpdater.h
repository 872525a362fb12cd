#pragma once

#include <memory>
#include <set>

#include "platform/RunLoop.h"
#include "platform/foundation/Date.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

class NBTransitIncidentUpdater;

/// Hears of an updater's moments, on the main thread. May invalidate the updater meanwhile.
class NBTransitIncidentUpdaterObserver {
 public:
  virtual ~NBTransitIncidentUpdaterObserver() = default;
  /// An incident starts or ends at `date`, which was reached: the rows are to be built again for the present moment.
  virtual void transitIncidentUpdater_dateExpired(NBTransitIncidentUpdater& updater, Date date) = 0;
  /// The refresh interval has passed: the line items are to be fetched again.
  virtual void transitIncidentUpdaterNeedsRefresh(NBTransitIncidentUpdater& updater) = 0;
};

/// Tells when the rows of some line items change by themselves, because an incident starts or ends, and when the line
/// items are to be fetched again. Runs from its creation until `invalidate`: the timers hold it, so its owner
/// invalidates it before letting go. Main thread only.
class NBTransitIncidentUpdater final : public Object {
 public:
  /// The interval in seconds, greater than 0.
  static std::shared_ptr<NBTransitIncidentUpdater> initWithTransitLineItems_refreshInterval(
      TransitLineItems lineItems, TimeInterval refreshInterval);
  NBTransitIncidentUpdater(TransitLineItems lineItems, TimeInterval refreshInterval);
  ~NBTransitIncidentUpdater() override;

  /// The dates still to come, each once: starts and ends that lay in the future when the updater was made.
  std::set<Date> updateDates() const { return _dates; }
  const TransitLineItems& lineItems() const { return _lineItems; }
  /// Seconds.
  TimeInterval refreshInterval() const { return _refreshInterval; }

  /// Null when there is none, or it is gone.
  std::shared_ptr<NBTransitIncidentUpdaterObserver> observer() const { return _observer.lock(); }
  void setObserver(std::weak_ptr<NBTransitIncidentUpdaterObserver> observer) { _observer = std::move(observer); }

  /// Ends both timers for good. Harmless when repeated.
  void invalidate();

  std::string_view className() const override { return "NBTransitIncidentUpdater"; }

 private:
  std::set<Date> _calculateUpdateDatesForIncidents() const;
  void _scheduleAutoRefreshTimer();
  void _schedulateNextUpdate();
  void _nextUpdateTimerFired(Timer& timer);
  void _autoRefreshTimerFired(Timer& timer);
  std::shared_ptr<NBTransitIncidentUpdater> self();

  std::set<Date> _dates;
  std::shared_ptr<Timer> _updateTimer;
  std::shared_ptr<Timer> _autoRefreshTimer;
  TransitLineItems _lineItems;
  TimeInterval _refreshInterval;
  std::weak_ptr<NBTransitIncidentUpdaterObserver> _observer;
};

}  // namespace nimbo
