#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <utility>
#include <vector>

#include "desktop/store/StateDatabase.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// What makes an incident one that has to be looked at again when it changes.
struct IncidentForm {
  using Period = std::pair<std::optional<Date>, std::optional<Date>>;  ///< from when until when; absent: open

  std::uint64_t muid = 0;
  std::uint64_t digest = 0;          ///< of texts, effect and severity
  std::vector<std::uint64_t> lines;  ///< numbers of the favorites that it is on
  std::vector<Period> periods;       ///< those that matter now
};

/// The incidents that the rider has seen, at one moment.
class SeenForms {
 public:
  void add(IncidentForm form);
  bool isEmpty() const { return _forms.empty(); }
  /// Whether the incident was seen as it is now: under its number, or under another one on one of its lines. A period
  /// that has begun in the meantime is the same one wherever it began, and those beyond what was known then are no
  /// change.
  bool have(const IncidentForm& form, Date now) const;

 private:
  std::map<std::uint64_t, IncidentForm> _forms;
  std::multimap<std::uint64_t, std::uint64_t> _numbersOfDigests;
};

/// The seen incidents in the state database. Any thread.
class SeenIncidents final {
 public:
  explicit SeenIncidents(std::shared_ptr<StateDatabase> database) : _database(std::move(database)) {}

  Outcome<SeenForms> list() const;
  /// Keeps these as seen, and forgets what was kept last more than 90 days before `now`. Null on success, otherwise
  /// nothing has changed.
  ErrorRef keep(const std::vector<IncidentForm>& forms, Date now) const;

 private:
  std::shared_ptr<StateDatabase> _database;
};

}  // namespace nimbo
