#include "desktop/store/ToldIncidents.h"

#include <map>
#include <nlohmann/json.hpp>

#include "desktop/raii/SQLite.h"
#include "desktop/store/JSONDate.h"

namespace nimbo {

using nlohmann::json;

namespace {

std::string contentOfTold(const ToldIncident& incident) {
  return json{
      {"texts", incident.texts}, {"shown", incident.shown},       {"title", incident.title},
      {"lines", incident.lines}, {"severity", incident.severity}, {"concern", incident.concern},
      {"key", incident.key},     {"wasTold", incident.wasTold},   {"restsSince", jsonOfDate(incident.restsSince)}}
      .dump(-1, ' ', false, json::error_handler_t::replace);
}

ToldIncident toldOfContent(std::uint64_t muid, const std::string& text) {
  const json content = json::parse(text);
  ToldIncident incident{.muid = muid};
  for (const auto& [key, number] : {std::pair("texts", &incident.texts), {"shown", &incident.shown}})
    content.at(key).get_to(*number);
  for (const auto& [key, number] : {std::pair("severity", &incident.severity), {"concern", &incident.concern}})
    content.at(key).get_to(*number);
  for (const auto& [key, words] : {std::pair("title", &incident.title), {"key", &incident.key}})
    content.at(key).get_to(*words);
  content.at("lines").get_to(incident.lines);
  content.at("wasTold").get_to(incident.wasTold);
  incident.restsSince = dateOfJSON(content.at("restsSince"));
  return incident;
}

/// What cannot be understood counts as not there.
ToldState readState(SQLiteConnection& connection) {
  ToldState state;
  try {
    SQLiteStatement whole = connection.prepare("SELECT content FROM telling WHERE id = 1");
    if (!whole.step()) return state;
    const json content = json::parse(whole.text(0));
    content.at("lines").get_to(state.lines);
    state.asked = dateOfJSON(content.at("asked"));
    SQLiteStatement rows = connection.prepare("SELECT muid, content FROM told ORDER BY muid");
    while (rows.step())
      state.incidents.push_back(toldOfContent(static_cast<std::uint64_t>(rows.integer(0)), rows.text(1)));
    return state;
  } catch (const json::exception&) {
    return {};
  }
}

void writeState(SQLiteConnection& connection, const ToldState& before, const ToldState& after) {
  std::map<std::uint64_t, const ToldIncident*> old;
  for (const ToldIncident& incident : before.incidents) old[incident.muid] = &incident;
  SQLiteStatement insert = connection.prepare("INSERT OR REPLACE INTO told(muid, content) VALUES (?, ?)");
  for (const ToldIncident& incident : after.incidents) {
    const auto known = old.find(incident.muid);
    const bool isSame = known != old.end() && *known->second == incident;
    if (known != old.end()) old.erase(known);
    if (isSame) continue;
    const std::string content = contentOfTold(incident);
    insert.bind(1, static_cast<std::int64_t>(incident.muid));
    insert.bind(2, content);
    insert.step();
    insert.reset();
  }
  SQLiteStatement remove = connection.prepare("DELETE FROM told WHERE muid = ?");
  for (const auto& [muid, incident] : old) {
    remove.bind(1, static_cast<std::int64_t>(muid));
    remove.step();
    remove.reset();
  }
  const std::string content = json{{"lines", after.lines}, {"asked", jsonOfDate(after.asked)}}.dump();
  SQLiteStatement whole = connection.prepare("INSERT OR REPLACE INTO telling(id, content) VALUES (1, ?)");
  whole.bind(1, content);
  whole.step();
}

}  // namespace

Outcome<ToldState> ToldIncidents::state() const {
  ToldState state;
  const ErrorRef error = _database->read([&](SQLiteConnection& connection) -> ErrorRef {
    state = readState(connection);
    return nullptr;
  });
  if (error) return error;
  return state;
}

ErrorRef ToldIncidents::change(const Change& change) const {
  // Most answers change nothing: they keep nobody from writing.
  Outcome<ToldState> before = state();
  if (!before) return before.error();
  ToldState after = *before;
  change(after);
  if (after == *before) return nullptr;
  return _database->write([&](SQLiteConnection& connection) -> ErrorRef {
    const ToldState now = readState(connection);
    ToldState changed = now;
    change(changed);
    if (!(changed == now)) writeState(connection, now, changed);
    return nullptr;
  });
}

ErrorRef ToldIncidents::beginAnew() const {
  return change([](ToldState& state) { state.lines.clear(); });
}

}  // namespace nimbo
