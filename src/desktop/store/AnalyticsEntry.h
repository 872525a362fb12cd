#pragma once

#include <string_view>
#include <variant>

#include "platform/AnalyticsPipeline.h"

namespace nimbo {

struct AnalyticsUserAction {
  int action = 0;
  int target = 0;
  std::optional<std::string> value;
};

struct AnalyticsWidgetInteraction {
  int widgetType = 0;
  int endState = 0;
  TransitWidgetAnalyticsRecord record;
  bool wasLocked = false;
  Date startDate;
  TimeInterval duration = 0;  ///< seconds
};

/// One kept record.
struct AnalyticsEntry {
  Date date;  ///< when it was captured
  std::variant<AnalyticsUserAction, AnalyticsWidgetInteraction> content;
};

/// The entry as a JSON object on one line (see docs/state-database.md), the form in which it is kept.
std::string jsonOfAnalyticsEntry(const AnalyticsEntry& entry);
/// Absent when the text is no entry.
std::optional<AnalyticsEntry> analyticsEntryOfJSON(std::string_view text);

}  // namespace nimbo
