#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "desktop/store/StateDatabase.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// An incident that the user was told of, or that counts as told.
struct ToldIncident {
  std::uint64_t muid = 0;
  std::uint64_t texts = 0;           ///< digest of them, by which it is known under another number
  std::uint64_t shown = 0;           ///< digest of all that a notice says of it
  std::string title;                 ///< for when it is over
  std::vector<std::uint64_t> lines;  ///< numbers of the favorites that it is or was on
  int severity = 0;                  ///< the greatest so far, as protocol::Severity
  int concern = 0;                   ///< the same, as protocol::Concern
  std::optional<Date> restsSince;    ///< between two of its periods; absent: in force
  std::string key;                   ///< of the notice that tells of it; empty: none stands
  bool wasTold = false;              ///< a notice told of it at some time

  bool operator==(const ToldIncident&) const = default;
};

/// What was told, at one moment.
struct ToldState {
  std::vector<ToldIncident> incidents;
  /// Numbers of the favorites whose incidents are known: what begins on them is told, what is on others counts as told.
  std::vector<std::uint64_t> lines;
  /// When the answer ended that changed this last; absent before the first one.
  std::optional<Date> asked;

  bool operator==(const ToldState&) const = default;
};

/// What was told, in the state database. Any thread.
class ToldIncidents final {
 public:
  /// Changes the state that it is given. May be called twice, the last time counts.
  using Change = std::function<void(ToldState& state)>;

  explicit ToldIncidents(std::shared_ptr<StateDatabase> database) : _database(std::move(database)) {}

  Outcome<ToldState> state() const;
  /// Changes the state in one transaction, with every other writer kept out; nothing is written where it stays the
  /// same. Null on success, otherwise nothing has changed.
  ErrorRef change(const Change& change) const;
  /// Has what runs now count as told. Null on success.
  ErrorRef beginAnew() const;

 private:
  std::shared_ptr<StateDatabase> _database;
};

}  // namespace nimbo
