#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "platform/foundation/Date.h"

namespace nimbo {

// The codes of the records.
inline constexpr int kAnalyticsActionExpand = 10;
inline constexpr int kAnalyticsActionCollapse = 11;
inline constexpr int kAnalyticsActionOpenItem = 9001;
inline constexpr int kAnalyticsTargetTransitWidget = 706;

/// One incident that the widget showed during a session.
struct TransitIncidentAnalyticsItem {
  std::string transitLineMuid;  ///< decimal identifier of the line it was shown for
  std::string transitIncidentTitle;
  std::uint64_t count = 1;  ///< in how many reports
};

/// What one appearance of the widget showed.
struct TransitWidgetAnalyticsRecord {
  bool initiallyExpanded = false;
  bool everExpanded = false;
  int transitMessageType = 0;                               ///< 0 until a build reported; then 1 to 4
  std::vector<TransitIncidentAnalyticsItem> incidentItems;  ///< each once, in the order of their first reports
  std::optional<std::int64_t> tappedItemIndex;              ///< absent when no row was opened
  std::size_t next = 0;  ///< the place behind the item added last: reports come in the same order again

  /// Counts one that is there already: a day on screen has a thousand reports, mostly of the same incidents.
  void addTransitIncidentItem(TransitIncidentAnalyticsItem item);
};

/// Keeps usage records. Main thread only; a record that cannot be kept is logged and dropped.
class AnalyticsPipeline {
 public:
  virtual ~AnalyticsPipeline() = default;
  virtual void captureUserAction(int action, int target, const std::optional<std::string>& value) = 0;
  /// `duration` in seconds.
  virtual void captureWidgetInteraction(int widgetType, int endState, const TransitWidgetAnalyticsRecord& record,
                                        bool wasLocked, Date startDate, TimeInterval duration) = 0;
};

}  // namespace nimbo
