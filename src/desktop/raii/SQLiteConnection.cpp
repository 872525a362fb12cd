#include "desktop/raii/SQLiteConnection.h"

#include <sqlite3.h>

#include "desktop/raii/SQLiteFailure.h"

namespace nimbo {

namespace {

constexpr int kBusyTimeoutMilliseconds = 5000;

/// A file name as URI. Source: https://www.sqlite.org/uri.html
std::string uriOfFile(const std::filesystem::path& file, std::string_view query) {
  std::string uri = "file:";
  const std::filesystem::path whole = std::filesystem::absolute(file);
  for (const char c : whole.native()) {
    if (c == '?')
      uri += "%3f";
    else if (c == '#')
      uri += "%23";
    else if (c == '%')
      uri += "%25";
    else
      uri += c;
  }
  return uri.append("?").append(query);
}

}  // namespace

void SQLiteConnection::Closer::operator()(sqlite3* database) const { sqlite3_close_v2(database); }

SQLiteConnection::SQLiteConnection(const std::filesystem::path& file, Access access, int maximumValueBytes) {
  constexpr int kShared = SQLITE_OPEN_NOMUTEX | SQLITE_OPEN_EXRESCODE;
  sqlite3* database = nullptr;
  const int code = access == Access::readWrite
                       ? sqlite3_open_v2(file.c_str(), &database, kShared | SQLITE_OPEN_READWRITE, nullptr)
                       : sqlite3_open_v2(uriOfFile(file, "immutable=1").c_str(), &database,
                                         kShared | SQLITE_OPEN_READONLY | SQLITE_OPEN_URI, nullptr);
  _database.reset(database);
  check(code);
  sqlite3_busy_timeout(database, kBusyTimeoutMilliseconds);
  sqlite3_limit(database, SQLITE_LIMIT_LENGTH, maximumValueBytes);
}

void SQLiteConnection::check(int code) const {
  if (code != SQLITE_OK) throw SQLiteFailure(code, _database ? sqlite3_errmsg(_database.get()) : sqlite3_errstr(code));
}

void SQLiteConnection::execute(const char* statements) {
  check(sqlite3_exec(_database.get(), statements, nullptr, nullptr, nullptr));
}

SQLiteStatement SQLiteConnection::prepare(std::string_view statement) {
  sqlite3_stmt* prepared = nullptr;
  check(sqlite3_prepare_v2(_database.get(), statement.data(), static_cast<int>(statement.size()), &prepared, nullptr));
  return SQLiteStatement(prepared);
}

std::int64_t SQLiteConnection::integer(std::string_view statement) {
  SQLiteStatement query = prepare(statement);
  return query.step() ? query.integer(0) : 0;
}

bool SQLiteConnection::hasMoved() const {
  int moved = 0;
  sqlite3_file_control(_database.get(), "main", SQLITE_FCNTL_HAS_MOVED, &moved);
  return moved != 0;
}

void SQLiteConnection::keepLogOnClose() {
  sqlite3_db_config(_database.get(), SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 1, nullptr);
}

}  // namespace nimbo
