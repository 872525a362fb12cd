#pragma once

#include "desktop/raii/SQLiteConnection.h"
#include "desktop/raii/SQLiteFailure.h"

namespace nimbo {

/// A transaction, undone when it dies before it is committed. Lives no longer than its connection.
class SQLiteTransaction final {
 public:
  enum class Kind {
    reading,  ///< sees one state throughout
    writing,  ///< also keeps other writers out from the beginning
  };

  SQLiteTransaction(SQLiteConnection& connection, Kind kind) : _connection(connection) {
    connection.execute(kind == Kind::reading ? "BEGIN" : "BEGIN IMMEDIATE");
  }
  ~SQLiteTransaction() {
    if (_committed) return;
    try {
      _connection.execute("ROLLBACK");
    } catch (const SQLiteFailure&) {
      // SQLite has undone the transaction itself, as it does after a full disk.
    }
  }
  SQLiteTransaction(const SQLiteTransaction&) = delete;
  SQLiteTransaction& operator=(const SQLiteTransaction&) = delete;

  void commit() {
    _connection.execute("COMMIT");
    _committed = true;
  }

 private:
  SQLiteConnection& _connection;
  bool _committed = false;
};

}  // namespace nimbo
