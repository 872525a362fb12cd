#include "desktop/store/SQLiteAnalyticsPipeline.h"

#include "platform/foundation/Log.h"

namespace nimbo {

SQLiteAnalyticsPipeline::SQLiteAnalyticsPipeline(std::shared_ptr<StateDatabase> database)
    : _database(std::move(database)), _settings(SQLiteSharedSettings(_database).groupStore()) {}

void SQLiteAnalyticsPipeline::captureUserAction(int action, int target, const std::optional<std::string>& value) {
  keep({currentDate(), AnalyticsUserAction{action, target, value}});
}

void SQLiteAnalyticsPipeline::captureWidgetInteraction(int widgetType, int endState,
                                                       const TransitWidgetAnalyticsRecord& record, bool wasLocked,
                                                       Date startDate, TimeInterval duration) {
  keep({currentDate(), AnalyticsWidgetInteraction{widgetType, endState, record, wasLocked, startDate, duration}});
}

void SQLiteAnalyticsPipeline::keep(const AnalyticsEntry& entry) {
  if (_settings->boolForKey(kAnalyticsDisabledKey)) return;
  const std::string content = jsonOfAnalyticsEntry(entry);
  const ErrorRef error = _database->write([&](SQLiteConnection& connection) -> ErrorRef {
    SQLiteStatement insert = connection.prepare("INSERT INTO analytics(content) VALUES (?)");
    insert.bind(1, content);
    insert.step();
    SQLiteStatement trim = connection.prepare("DELETE FROM analytics WHERE id <= (SELECT max(id) FROM analytics) - ?");
    trim.bind(1, kMaximumEntries);
    trim.step();
    return nullptr;
  });
  if (error)
    writeLog({kDefaultLogSubsystem, "Analytics"}, LogLevel::error, "Unable to keep an analytics record: %@",
             {error->reason()});
}

Outcome<std::vector<AnalyticsEntry>> SQLiteAnalyticsPipeline::list() const {
  std::vector<AnalyticsEntry> entries;
  const ErrorRef error = _database->read([&](SQLiteConnection& connection) -> ErrorRef {
    SQLiteStatement query = connection.prepare("SELECT content FROM analytics ORDER BY id");
    while (query.step())
      if (auto entry = analyticsEntryOfJSON(query.text(0))) entries.push_back(std::move(*entry));
    return nullptr;
  });
  if (error) return error;
  return entries;
}

ErrorRef SQLiteAnalyticsPipeline::clear() {
  return _database->write([](SQLiteConnection& connection) -> ErrorRef {
    connection.execute("DELETE FROM analytics");
    return nullptr;
  });
}

}  // namespace nimbo
