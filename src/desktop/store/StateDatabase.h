#pragma once

#include <functional>
#include <mutex>

#include "desktop/store/StateDatabaseFile.h"

namespace nimbo {

/// The database in which the settings, the favourites and the analytics are kept: "state.sqlite" in the state folder,
/// used by the widget process and its hosts at once. One connection, opened with the first use and shared by the
/// process's threads one after the other. Any thread; nothing throws but what the work given throws.
class StateDatabase final {
 public:
  /// Told when a damaged database was set aside and a new one begun: what the user must be shown. Called on the thread
  /// that found the damage; uses the database no more.
  using Notice = std::function<void(const ErrorRef&)>;
  /// Work on the open database. An error that it answers undoes what it wrote and is handed on.
  using Work = std::function<ErrorRef(SQLiteConnection&)>;

  enum class Durability {
    process,  ///< outlives the process, not always a power failure of the next seconds
    power,    ///< outlives a power failure too, and what rots in the log
  };

  /// Touches nothing yet. `folder` need not exist; `clock` outlives the database.
  StateDatabase(std::filesystem::path folder, const Clock& clock, Notice notice);

  const std::filesystem::path& path() const { return _file.path(); }

  /// Runs `work` on one state of the database. `work` is not called while nothing was ever kept; reading makes no file.
  /// Null on success.
  ErrorRef read(const Work& work);

  /// Runs `work` in one transaction, with every other writer kept out. Null once what it wrote is kept; after an error
  /// nothing has changed.
  ErrorRef write(const Work& work, Durability durability = Durability::process);

 private:
  ErrorRef run(StateDatabaseFile::Purpose purpose, const Work& work);
  /// Takes over a newly opened database; its error, if there is one.
  ErrorRef adopt(StateDatabaseFile::Opened opened);

  StateDatabaseFile _file;
  Notice _notice;
  std::mutex _lock;
  std::unique_ptr<SQLiteConnection> _connection;
  bool _isSnapshot = false;
};

}  // namespace nimbo
