#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

#include "platform/foundation/Boxed.h"

struct sqlite3_stmt;
struct sqlite3;

namespace nimbo {

/// Something that SQLite could not do. Thrown below the store, which turns it into an error value.
class SQLiteFailure final : public std::runtime_error {
 public:
  /// `code` is an SQLite result code, primary or extended. Source: https://www.sqlite.org/rescode.html
  SQLiteFailure(int code, const std::string& message) : std::runtime_error(message), _code(code & 0xff) {}

  /// The primary result code.
  int code() const { return _code; }
  /// Whether the file is damaged or never was a database.
  bool meansDamage() const;

 private:
  int _code;
};

/// A statement in progress. Lives no longer than its connection; one thread at a time. Everything may throw
/// SQLiteFailure. Parameters count from 1, columns from 0.
class SQLiteStatement final {
 public:
  enum class ColumnType { null, integer, real, text, blob };

  /// Takes over the handle.
  explicit SQLiteStatement(sqlite3_stmt* statement) : _statement(statement) {}

  void bind(int parameter, std::int64_t value);
  /// The text is not copied: it outlives the last step.
  void bind(int parameter, std::string_view value);
  /// The bytes are not copied: they outlive the last step.
  void bind(int parameter, const Bytes& value);
  /// The value in a column of another statement's row, copied.
  void bindColumn(int parameter, const SQLiteStatement& row, int column);

  /// Moves to the next row; NO when there is none. A statement without rows is done after one step.
  bool step();
  /// Back to before the first row, the parameters kept.
  void reset();

  ColumnType type(int column) const;
  std::int64_t integer(int column) const;
  std::string text(int column) const;
  Bytes bytes(int column) const;

 private:
  struct Finalizer {
    void operator()(sqlite3_stmt* statement) const;
  };
  void check(int code) const;

  std::unique_ptr<sqlite3_stmt, Finalizer> _statement;
};

/// An open database file; one thread at a time. Everything may throw SQLiteFailure.
class SQLiteConnection final {
 public:
  enum class Access {
    readWrite,  ///< reads only where the file does not let itself be written
    immutable,  ///< reads a file that nobody changes, leaving no file beside it
    alone,      ///< reads while nobody else has it open, making no file beside it, as a full disk asks for
  };

  /// Opens a file that exists, and is reached through no link but of its folders. Values longer than
  /// `maximumValueBytes` are neither read nor written; another connection's lock is waited for up to 5 seconds.
  SQLiteConnection(const std::filesystem::path& file, Access access, int maximumValueBytes);

  /// Runs statements that give no rows.
  void execute(const char* statements);
  SQLiteStatement prepare(std::string_view statement);
  /// The first column of the first row, 0 without one.
  std::int64_t integer(std::string_view statement);

  /// Whether the file was renamed, replaced or deleted since it was opened.
  bool hasMoved() const;
  /// Writes the write-ahead log back into the file and empties it. What cannot be written back now stays in the log.
  void writeBackLog();
  /// Leaves the write-ahead log as it is when the connection closes.
  void keepLogOnClose();

 private:
  struct Closer {
    void operator()(sqlite3* database) const;
  };
  void check(int code) const;

  std::unique_ptr<sqlite3, Closer> _database;
};

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
