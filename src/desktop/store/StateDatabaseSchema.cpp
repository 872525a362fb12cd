#include "desktop/store/StateDatabaseSchema.h"

#include "desktop/raii/SQLiteTransaction.h"
#include "desktop/store/StateDatabaseFile.h"

namespace nimbo {

namespace {

/// Copies the rows of a table up to the first that cannot be read, and counts them. Whether that was all of them.
bool copyReadableRows(SQLiteConnection& from, SQLiteConnection& into, const std::string& table, std::size_t& count) {
  try {
    SQLiteStatement rows = from.prepare("SELECT * FROM " + table);
    std::string parameters = "?";
    for (int i = 1; i < rows.columnCount(); ++i) parameters += ", ?";
    SQLiteStatement insert = into.prepare("INSERT INTO " + table + " VALUES (" + parameters + ")");
    for (; rows.step(); ++count) {
      for (int i = 0; i < rows.columnCount(); ++i) insert.bindColumn(i + 1, rows, i);
      insert.step();
      insert.reset();
    }
    return true;
  } catch (const SQLiteFailure&) {
    return false;  // the rest of the table is lost; the count says what is not
  }
}

}  // namespace

void createStateSchema(SQLiteConnection& connection) {
  connection.prepare("PRAGMA journal_mode = WAL").step();
  SQLiteTransaction transaction(connection, SQLiteTransaction::Kind::writing);
  connection.execute(
      // A boolean is an integer, a text a text, bytes are a blob.
      "CREATE TABLE settings(key TEXT NOT NULL PRIMARY KEY, value NOT NULL);"
      // In the order of position; muid and content as JSON are a line's, other kinds hold what their owners please.
      "CREATE TABLE favorites(id INTEGER PRIMARY KEY, position INTEGER NOT NULL, kind TEXT NOT NULL, muid INTEGER,"
      "                       content);"
      // One entry a row as JSON, the newest last.
      "CREATE TABLE analytics(id INTEGER PRIMARY KEY, content TEXT NOT NULL);");
  connection.execute(("PRAGMA user_version = " + std::to_string(kStateSchemaVersion)).c_str());
  transaction.commit();
}

SalvagedCounts salvageState(const std::filesystem::path& damaged, const std::filesystem::path& aside,
                            SQLiteConnection& into) {
  SQLiteTransaction transaction(into, SQLiteTransaction::Kind::writing);
  SalvagedCounts counts;
  bool hasAllFavorites = false;
  try {
    SQLiteConnection from(damaged, SQLiteConnection::Access::readWrite, kMaximumStateValueBytes);
    from.keepLogOnClose();
    copyReadableRows(from, into, "settings", counts.settings);
    hasAllFavorites = copyReadableRows(from, into, "favorites", counts.favorites);
  } catch (const SQLiteFailure&) {
    // It cannot be opened at all.
  }
  if (!hasAllFavorites) {
    SQLiteStatement insert = into.prepare("INSERT OR REPLACE INTO settings(key, value) VALUES (?, ?)");
    insert.bind(1, kFavoritesLostKey);
    insert.bind(2, aside.native());
    insert.step();
  }
  transaction.commit();
  return counts;
}

}  // namespace nimbo
