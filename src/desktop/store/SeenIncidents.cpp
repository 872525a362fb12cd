#include "desktop/store/SeenIncidents.h"

#include <algorithm>
#include <nlohmann/json.hpp>

#include "desktop/raii/SQLite.h"
#include "desktop/store/JSONDate.h"

namespace nimbo {

using nlohmann::json;

namespace {

constexpr std::chrono::days kSeenForgotten{90};
/// Periods to come that a reading of the alerts tells at most; more of them follow.
constexpr std::size_t kManyPeriods = 16;

std::string contentOf(const IncidentForm& form) {
  json periods = json::array();
  for (const auto& [from, until] : form.periods) periods.push_back({jsonOfDate(from), jsonOfDate(until)});
  return json{{"lines", form.lines}, {"periods", periods}}.dump();
}

/// NO where the text is nothing of this kind.
bool takeContent(IncidentForm& form, const std::string& text) {
  try {
    const json content = json::parse(text);
    form.lines = content.at("lines").get<std::vector<std::uint64_t>>();
    for (const json& period : content.at("periods"))
      form.periods.emplace_back(dateOfJSON(period.at(0)), dateOfJSON(period.at(1)));
    return true;
  } catch (const json::exception&) {
    return false;
  }
}

bool isKnown(const IncidentForm::Period& period, const std::vector<IncidentForm::Period>& known, Date now) {
  const auto hasBegun = [now](const IncidentForm::Period& one) { return !one.first || *one.first <= now; };
  if (std::any_of(known.begin(), known.end(), [&](const IncidentForm::Period& other) {
        return other.second == period.second && (other.first == period.first || (hasBegun(other) && hasBegun(period)));
      }))
    return true;
  return known.size() >= kManyPeriods &&
         std::all_of(known.begin(), known.end(), [&](const auto& other) { return other.first < period.first; });
}

bool haveCommon(const std::vector<std::uint64_t>& some, const std::vector<std::uint64_t>& others) {
  return std::any_of(some.begin(), some.end(),
                     [&](std::uint64_t line) { return std::find(others.begin(), others.end(), line) != others.end(); });
}

}  // namespace

void SeenForms::add(IncidentForm form) {
  _numbersOfDigests.emplace(form.digest, form.muid);
  _forms[form.muid] = std::move(form);
}

bool SeenForms::have(const IncidentForm& form, Date now) const {
  const auto [begin, end] = _numbersOfDigests.equal_range(form.digest);
  return std::any_of(begin, end, [&](const auto& entry) {
    const IncidentForm& seen = _forms.at(entry.second);
    return (seen.muid == form.muid || haveCommon(seen.lines, form.lines)) &&
           std::all_of(form.periods.begin(), form.periods.end(),
                       [&](const IncidentForm::Period& period) { return isKnown(period, seen.periods, now); });
  });
}

Outcome<SeenForms> SeenIncidents::list() const {
  SeenForms seen;
  const ErrorRef error = _database->read([&](SQLiteConnection& connection) -> ErrorRef {
    SQLiteStatement query = connection.prepare("SELECT muid, digest, content FROM seen");
    while (query.step()) {
      IncidentForm form{
          static_cast<std::uint64_t>(query.integer(0)), static_cast<std::uint64_t>(query.integer(1)), {}, {}};
      if (takeContent(form, query.text(2))) seen.add(std::move(form));
    }
    return nullptr;
  });
  if (error) return error;
  return seen;
}

ErrorRef SeenIncidents::keep(const std::vector<IncidentForm>& forms, Date now) const {
  return _database->write([&](SQLiteConnection& connection) -> ErrorRef {
    SQLiteStatement insert =
        connection.prepare("INSERT OR REPLACE INTO seen(muid, digest, content, date) VALUES (?, ?, ?, ?)");
    const std::int64_t date = now.time_since_epoch().count();
    for (const IncidentForm& form : forms) {
      const std::string content = contentOf(form);
      insert.bind(1, static_cast<std::int64_t>(form.muid));
      insert.bind(2, static_cast<std::int64_t>(form.digest));
      insert.bind(3, content);
      insert.bind(4, date);
      insert.step();
      insert.reset();
    }
    SQLiteStatement forget = connection.prepare("DELETE FROM seen WHERE date < ?");
    forget.bind(1, Date(now - kSeenForgotten).time_since_epoch().count());
    forget.step();
    return nullptr;
  });
}

}  // namespace nimbo
