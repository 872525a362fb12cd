#pragma once

#include <string_view>
#include <variant>

#include "desktop/store/SQLiteSharedSettings.h"
#include "platform/AnalyticsPipeline.h"
#include "platform/foundation/Outcome.h"

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

/// Setting that turns the keeping of analytics off while it is YES.
inline constexpr std::string_view kAnalyticsDisabledKey = "Nimbo.TransitWidget.analytics.disabled";

/// Keeps the newest analytics records in the state database, and nowhere else.
class SQLiteAnalyticsPipeline final : public AnalyticsPipeline {
 public:
  /// Records beyond this number push the oldest out.
  static constexpr std::int64_t kMaximumEntries = 1000;

  /// Throws std::invalid_argument without a database.
  explicit SQLiteAnalyticsPipeline(std::shared_ptr<StateDatabase> database);

  void captureUserAction(int action, int target, const std::optional<std::string>& value) override;
  void captureWidgetInteraction(int widgetType, int endState, const TransitWidgetAnalyticsRecord& record,
                                bool wasLocked, Date startDate, TimeInterval duration) override;

  /// Sets `entries` to what is kept, the oldest first; a record that cannot be understood is left out. Null on success.
  Outcome<std::vector<AnalyticsEntry>> list() const;

 private:
  void keep(const AnalyticsEntry& entry);

  std::shared_ptr<StateDatabase> _database;
  std::shared_ptr<SharedSettingsStore> _settings;
};

}  // namespace nimbo
