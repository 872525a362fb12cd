#include "desktop/store/SQLiteAnalyticsPipeline.h"

#include <nlohmann/json.hpp>

#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

using nlohmann::ordered_json;

template <class T>
std::optional<T> valueOf(const ordered_json& object, const char* key) {
  const auto found = object.find(key);
  return found == object.end() || found->is_null() ? std::nullopt : std::optional(found->get<T>());
}

template <class T>
ordered_json orNull(const std::optional<T>& value) {
  return value ? ordered_json(*value) : ordered_json(nullptr);
}

/// Throws std::runtime_error for a text that is no date.
Date dateOf(const ordered_json& object, const char* key) {
  const auto date = dateFromISOText(object.at(key).get<std::string>());
  if (!date) throw std::runtime_error("no date");
  return *date;
}

ordered_json jsonOf(const AnalyticsUserAction& action) {
  return {{"action", action.action}, {"target", action.target}, {"value", orNull(action.value)}};
}

ordered_json jsonOf(const AnalyticsWidgetInteraction& interaction) {
  const TransitWidgetAnalyticsRecord& record = interaction.record;
  ordered_json incidents = ordered_json::array();
  for (const TransitIncidentAnalyticsItem& item : record.incidentItems)
    incidents.push_back({{"transitLineMuid", item.transitLineMuid},
                         {"transitIncidentTitle", item.transitIncidentTitle},
                         {"count", item.count}});
  return {{"widgetType", interaction.widgetType},
          {"endState", interaction.endState},
          {"wasLocked", interaction.wasLocked},
          {"startDate", isoTextOfDate(interaction.startDate)},
          {"duration", interaction.duration},
          {"initiallyExpanded", record.initiallyExpanded},
          {"everExpanded", record.everExpanded},
          {"transitMessageType", record.transitMessageType},
          {"tappedItemIndex", orNull(record.tappedItemIndex)},
          {"incidentItems", std::move(incidents)}};
}

AnalyticsWidgetInteraction interactionOf(const ordered_json& object) {
  AnalyticsWidgetInteraction interaction;
  interaction.widgetType = object.at("widgetType");
  interaction.endState = object.at("endState");
  interaction.wasLocked = object.at("wasLocked");
  interaction.startDate = dateOf(object, "startDate");
  interaction.duration = object.at("duration");
  interaction.record.initiallyExpanded = object.at("initiallyExpanded");
  interaction.record.everExpanded = object.at("everExpanded");
  interaction.record.transitMessageType = object.at("transitMessageType");
  interaction.record.tappedItemIndex = valueOf<std::int64_t>(object, "tappedItemIndex");
  for (const ordered_json& item : object.at("incidentItems"))
    interaction.record.addTransitIncidentItem(
        {item.at("transitLineMuid"), item.at("transitIncidentTitle"), item.value("count", std::uint64_t{1})});
  return interaction;
}

}  // namespace

std::string jsonOfAnalyticsEntry(const AnalyticsEntry& entry) {
  ordered_json object{{"date", isoTextOfDate(entry.date)}};
  object.update(std::visit([](const auto& content) { return jsonOf(content); }, entry.content));
  return object.dump(-1, ' ', false, ordered_json::error_handler_t::replace);
}

std::optional<AnalyticsEntry> analyticsEntryOfJSON(std::string_view text) {
  try {
    const ordered_json object = ordered_json::parse(text);
    AnalyticsEntry entry{dateOf(object, "date"), {}};
    if (object.contains("widgetType"))
      entry.content = interactionOf(object);
    else
      entry.content =
          AnalyticsUserAction{object.at("action"), object.at("target"), valueOf<std::string>(object, "value")};
    return entry;
  } catch (const std::runtime_error&) {  // no date
  } catch (const ordered_json::exception&) {
  }
  return std::nullopt;
}

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

}  // namespace nimbo
