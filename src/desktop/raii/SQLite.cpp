#include "desktop/raii/SQLite.h"

#include <sqlite3.h>

namespace nimbo {

bool SQLiteFailure::meansDamage() const {
  // The program's statements are right: where one finds no table or column, the file's schema is damaged.
  return _code == SQLITE_CORRUPT || _code == SQLITE_NOTADB || _code == SQLITE_ERROR;
}

void SQLiteStatement::Finalizer::operator()(sqlite3_stmt* statement) const { sqlite3_finalize(statement); }

void SQLiteStatement::check(int code) const {
  if (code != SQLITE_OK) throw SQLiteFailure(code, sqlite3_errmsg(sqlite3_db_handle(_statement.get())));
}

void SQLiteStatement::bind(int parameter, std::int64_t value) {
  check(sqlite3_bind_int64(_statement.get(), parameter, value));
}

void SQLiteStatement::bind(int parameter, std::string_view value) {
  // A null pointer would bind NULL in place of the empty text.
  check(sqlite3_bind_text64(_statement.get(), parameter, value.empty() ? "" : value.data(), value.size(), nullptr,
                            SQLITE_UTF8));
}

void SQLiteStatement::bind(int parameter, const Bytes& value) {
  check(value.empty() ? sqlite3_bind_zeroblob(_statement.get(), parameter, 0)
                      : sqlite3_bind_blob64(_statement.get(), parameter, value.data(), value.size(), nullptr));
}

void SQLiteStatement::bindColumn(int parameter, const SQLiteStatement& row, int column) {
  check(sqlite3_bind_value(_statement.get(), parameter, sqlite3_column_value(row._statement.get(), column)));
}

bool SQLiteStatement::step() {
  const int code = sqlite3_step(_statement.get());
  if (code == SQLITE_ROW) return true;
  if (code == SQLITE_DONE) return false;
  check(code);
  return false;
}

void SQLiteStatement::reset() { sqlite3_reset(_statement.get()); }

SQLiteStatement::ColumnType SQLiteStatement::type(int column) const {
  switch (sqlite3_column_type(_statement.get(), column)) {
    case SQLITE_INTEGER:
      return ColumnType::integer;
    case SQLITE_FLOAT:
      return ColumnType::real;
    case SQLITE_TEXT:
      return ColumnType::text;
    case SQLITE_BLOB:
      return ColumnType::blob;
    default:
      return ColumnType::null;
  }
}

std::int64_t SQLiteStatement::integer(int column) const { return sqlite3_column_int64(_statement.get(), column); }

std::string SQLiteStatement::text(int column) const {
  const Bytes value = bytes(column);
  return {value.begin(), value.end()};
}

Bytes SQLiteStatement::bytes(int column) const {
  // Reading a large value can fail only here, with a null pointer for a value that is not NULL.
  const auto* first = static_cast<const std::uint8_t*>(sqlite3_column_blob(_statement.get(), column));
  const auto count = static_cast<std::size_t>(sqlite3_column_bytes(_statement.get(), column));
  if (!first) {
    const int code = sqlite3_errcode(sqlite3_db_handle(_statement.get()));
    if (code != SQLITE_OK && code != SQLITE_ROW) check(code);
    return {};
  }
  return Bytes(first, first + count);
}

namespace {

constexpr int kBusyTimeoutMilliseconds = 5000;

/// The same file with no link on the way to it; SQLite, told to follow none, would refuse linked folders too.
std::filesystem::path inResolvedFolder(const std::filesystem::path& file) {
  std::error_code ignored;
  const std::filesystem::path whole = std::filesystem::absolute(file);
  const std::filesystem::path folder = std::filesystem::canonical(whole.parent_path(), ignored);
  return ignored ? whole : folder / whole.filename();
}

/// A file name as URI. Source: https://www.sqlite.org/uri.html
std::string uriOfFile(const std::filesystem::path& file, std::string_view query) {
  std::string uri = "file:";
  for (const char c : file.native()) {
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
  constexpr int kShared = SQLITE_OPEN_NOMUTEX | SQLITE_OPEN_EXRESCODE | SQLITE_OPEN_NOFOLLOW;
  sqlite3* database = nullptr;
  const std::filesystem::path path = inResolvedFolder(file);
  const int code = access == Access::immutable
                       ? sqlite3_open_v2(uriOfFile(path, "immutable=1").c_str(), &database,
                                         kShared | SQLITE_OPEN_READONLY | SQLITE_OPEN_URI, nullptr)
                       : sqlite3_open_v2(path.c_str(), &database, kShared | SQLITE_OPEN_READWRITE, nullptr);
  _database.reset(database);
  check(code);
  sqlite3_busy_timeout(database, kBusyTimeoutMilliseconds);
  sqlite3_limit(database, SQLITE_LIMIT_LENGTH, maximumValueBytes);
  if (access != Access::alone) return;
  keepLogOnClose();
  prepare("PRAGMA locking_mode = EXCLUSIVE").step();  // the log's index is in memory then
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

void SQLiteConnection::writeBackLog() {
  sqlite3_wal_checkpoint_v2(_database.get(), nullptr, SQLITE_CHECKPOINT_TRUNCATE, nullptr, nullptr);
}

void SQLiteConnection::keepLogOnClose() {
  sqlite3_db_config(_database.get(), SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 1, nullptr);
}

}  // namespace nimbo
