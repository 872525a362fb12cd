#pragma once

#include <filesystem>

#include "desktop/raii/SQLiteStatement.h"

struct sqlite3;

namespace nimbo {

/// An open database file; one thread at a time. Everything may throw SQLiteFailure.
class SQLiteConnection final {
 public:
  enum class Access {
    readWrite,  ///< reads only where the file does not let itself be written
    immutable,  ///< reads a file that nobody changes, leaving no file beside it
  };

  /// Opens a file that exists. Values longer than `maximumValueBytes` are neither read nor written; another
  /// connection's lock is waited for up to 5 seconds.
  SQLiteConnection(const std::filesystem::path& file, Access access, int maximumValueBytes);

  /// Runs statements that give no rows.
  void execute(const char* statements);
  SQLiteStatement prepare(std::string_view statement);
  /// The first column of the first row, 0 without one.
  std::int64_t integer(std::string_view statement);

  /// Whether the file was renamed, replaced or deleted since it was opened.
  bool hasMoved() const;
  /// Leaves the write-ahead log as it is when the connection closes.
  void keepLogOnClose();

 private:
  struct Closer {
    void operator()(sqlite3* database) const;
  };
  void check(int code) const;

  std::unique_ptr<sqlite3, Closer> _database;
};

}  // namespace nimbo
