#pragma once

#include "platform/foundation/Date.h"

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

}  // namespace nimbo
