#include "desktop/store/StateDatabaseFile.h"

#include <sqlite3.h>

#include <algorithm>

#include "desktop/raii/SQLite.h"
#include "desktop/system/AtomicFile.h"

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

namespace fs = std::filesystem;

namespace {

std::string_view adviceFor(int sqliteCode) {
  switch (sqliteCode) {
    case SQLITE_FULL:
      return "Free some space and try again.";
    case SQLITE_BUSY:
    case SQLITE_LOCKED:
      return "Another program is using it: try again in a moment.";
    case SQLITE_CANTOPEN:
    case SQLITE_PERM:
    case SQLITE_READONLY:
    case SQLITE_AUTH:
      return "Check that you may read and write the file and its folder.";
    case SQLITE_TOOBIG:
      return "A single value may have 100 MiB at most.";
    case SQLITE_NOMEM:
      return "Close some programs and try again.";
    default:
      return "Check the disk that holds it.";
  }
}

fs::path withSuffix(const fs::path& path, std::string_view suffix) { return fs::path(path).concat(suffix); }

bool isMissing(const fs::path& path) {
  std::error_code failure;
  return fs::status(path, failure).type() == fs::file_type::not_found;
}

/// Makes the file where it is missing, for its owner only; SQLite gives the files that it makes beside it the same
/// mode. One that exists is not touched: closing it would drop the locks that this process may hold on it.
ErrorRef makeFile(const fs::path& path) {
  const FileDescriptor made(::open(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0600));
  return !made && errno != EEXIST ? fileError("make", path, errno) : nullptr;
}

bool mayWriteTo(const fs::path& folder) { return ::faccessat(AT_FDCWD, folder.c_str(), W_OK, AT_EACCESS) == 0; }

StateDatabaseFile::Opened failed(ErrorRef error) {
  StateDatabaseFile::Opened opened;
  opened.error = std::move(error);
  return opened;
}

/// The counts as a clause: "3 favourites and 1 setting".
std::string textOfCounts(const SalvagedCounts& counts) {
  const auto count = [](std::size_t n, const std::string& noun) {
    return std::to_string(n) + " " + noun + (n == 1 ? "" : "s");
  };
  return count(counts.favorites, "favorite") + " and " + count(counts.settings, "setting");
}

}  // namespace

StateDatabaseFile::StateDatabaseFile(fs::path folder, const Clock& clock)
    : _folder(std::move(folder)), _path(_folder / "state.sqlite"), _clock(clock) {}

ErrorRef StateDatabaseFile::error(StateDatabaseError code, std::string reason, const fs::path& subject) const {
  return Error::errorWithDomain_code_reason(std::string(kStateDatabaseErrorDomain), static_cast<std::int64_t>(code),
                                            std::move(reason), subject.native());
}

ErrorRef StateDatabaseFile::errorOfFailure(const SQLiteFailure& failure, Purpose purpose) const {
  const bool reading = purpose == Purpose::reading;
  return error(reading ? StateDatabaseError::cannotRead : StateDatabaseError::cannotWrite,
               (reading ? "Cannot read " : "Cannot write ") + _path.native() + ": " + failure.what() + ". " +
                   std::string(adviceFor(failure.code())),
               _path);
}

StateDatabaseFile::Opened StateDatabaseFile::open(Purpose purpose) {
  if (purpose == Purpose::writing) {
    if (ErrorRef error = makeFolders(_folder)) return failed(std::move(error));
  } else if (isMissing(_path) && isMissing(pathOfNew())) {
    return {};
  }
  const FolderLock lock(_folder);
  if (isMissing(_path) && !isMissing(pathOfNew())) putNewInPlace(nameForDamaged());
  try {
    return openLocked(purpose);
  } catch (const SQLiteFailure& failure) {
    if (!failure.meansDamage()) return failed(errorOfFailure(failure, purpose));
  }
  return replaceLocked();
}

StateDatabaseFile::Opened StateDatabaseFile::openLocked(Purpose purpose) {
  if (purpose == Purpose::writing)
    if (ErrorRef error = makeFile(_path)) return failed(std::move(error));
  Opened opened;
  opened.connection = connect(opened.isSnapshot);
  const std::int64_t version = opened.connection->integer("PRAGMA user_version");
  if (version > kStateSchemaVersion)
    return failed(error(StateDatabaseError::newerVersion,
                        _path.native() + " was written by a newer version of this program. Install that version, or "
                                         "choose another state folder.",
                        _path));
  if (version == kStateSchemaVersion) return opened;
  if (version < 0 || opened.connection->integer("SELECT count(*) FROM sqlite_schema") != 0)
    return failed(error(StateDatabaseError::foreign,
                        _path.native() + " is a database of another program. Move it away, or choose another state "
                                         "folder.",
                        _path));
  createStateSchema(*opened.connection);
  return opened;
}

std::unique_ptr<SQLiteConnection> StateDatabaseFile::connect(bool& isSnapshot) const {
  try {
    auto connection =
        std::make_unique<SQLiteConnection>(_path, SQLiteConnection::Access::readWrite, kMaximumStateValueBytes);
    connection->integer("PRAGMA user_version");  // the first access that needs the files beside this one
    return connection;
  } catch (const SQLiteFailure& failure) {
    // A database in WAL mode cannot be read where no file can be made, unless as one that never changes; that one
    // leaves the log out, so that a log with something in it must not be there.
    if (failure.code() != SQLITE_CANTOPEN && failure.code() != SQLITE_READONLY) throw;
    std::error_code noLog;
    const std::uintmax_t logBytes = fs::file_size(withSuffix(_path, "-wal"), noLog);
    if (mayWriteTo(_folder) || (!noLog && logBytes > 0)) throw;
  }
  isSnapshot = true;
  return std::make_unique<SQLiteConnection>(_path, SQLiteConnection::Access::immutable, kMaximumStateValueBytes);
}

fs::path StateDatabaseFile::nameForDamaged() const {
  std::string date = isoTextOfDate(std::chrono::floor<std::chrono::seconds>(_clock.now()));
  date.pop_back();  // the "Z"
  std::replace(date.begin(), date.end(), ':', '-');
  const fs::path name = withSuffix(_path, ".broken-" + date);
  fs::path free = name;
  for (int i = 2; fs::exists(fs::symlink_status(free)); ++i) free = withSuffix(name, "-" + std::to_string(i));
  return free;
}

StateDatabaseFile::Opened StateDatabaseFile::replaceDamaged(std::unique_ptr<SQLiteConnection> damaged) {
  const FolderLock lock(_folder);
  const bool wasReplaced = damaged->hasMoved();
  damaged->keepLogOnClose();
  damaged.reset();
  if (!wasReplaced) return replaceLocked();
  try {
    return openLocked(Purpose::writing);
  } catch (const SQLiteFailure& failure) {
    return failed(errorOfFailure(failure, Purpose::writing));
  }
}

fs::path StateDatabaseFile::pathOfNew() const { return withSuffix(_path, ".new"); }

void StateDatabaseFile::putNewInPlace(const fs::path& aside) const {
  // The log belongs to the damaged file; its index is made anew wherever it is missing.
  ::rename(withSuffix(_path, "-wal").c_str(), withSuffix(aside, "-wal").c_str());
  ::unlink(withSuffix(_path, "-shm").c_str());
  ::rename(pathOfNew().c_str(), _path.c_str());
}

StateDatabaseFile::Opened StateDatabaseFile::replaceLocked() {
  // The new one is whole before the damaged one goes: whenever this is cut short, the next opening finds the damaged
  // one and begins again, or finds it gone and puts the new one in its place.
  const fs::path aside = nameForDamaged();
  SalvagedCounts counts;
  Opened opened;
  try {
    for (const char* suffix : {"", "-wal", "-shm"}) ::unlink(withSuffix(pathOfNew(), suffix).c_str());
    if (ErrorRef error = makeFile(pathOfNew())) return failed(std::move(error));
    {
      SQLiteConnection fresh(pathOfNew(), SQLiteConnection::Access::readWrite, kMaximumStateValueBytes);
      createStateSchema(fresh);
      counts = salvageState(_path, aside, fresh);
    }
    if (::rename(_path.c_str(), aside.c_str()) != 0) return failed(fileError("set aside the damaged", _path, errno));
    putNewInPlace(aside);
    opened = openLocked(Purpose::writing);
  } catch (const SQLiteFailure& failure) {
    return failed(errorOfFailure(failure, Purpose::writing));
  }
  opened.notice = error(StateDatabaseError::setAside,
                        _path.native() + " was damaged and is now kept as " + aside.native() +
                            ". A new one was begun with what could be read of it: " + textOfCounts(counts) +
                            ". Check your favorites, and the disk.",
                        aside);
  return opened;
}

}  // namespace nimbo
