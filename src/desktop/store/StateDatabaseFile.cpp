#include "desktop/store/StateDatabaseFile.h"

#include <sqlite3.h>

#include <algorithm>

#include "desktop/raii/SQLite.h"
#include "desktop/store/FavoritesSeal.h"
#include "desktop/system/AtomicFile.h"

namespace nimbo {

namespace {

/// The next row; NO also where the rest cannot be read, which `isWhole` tells.
bool stepReadable(SQLiteStatement& rows, bool& isWhole) {
  try {
    return rows.step();
  } catch (const SQLiteFailure&) {
    isWhole = false;
    return false;
  }
}

void insertColumns(SQLiteStatement& insert, const SQLiteStatement& row, int count) {
  for (int i = 0; i < count; ++i) insert.bindColumn(i + 1, row, i);
  insert.step();
  insert.reset();
}

void copySettings(SQLiteConnection& from, SQLiteConnection& into, std::size_t& count) {
  SQLiteStatement rows = from.prepare("SELECT key, value FROM settings");
  SQLiteStatement insert = into.prepare("INSERT OR IGNORE INTO settings VALUES (?, ?)");
  for (bool isWhole = true; stepReadable(rows, isWhole); ++count) insertColumns(insert, rows, 2);
}

/// Version 1 kept among the settings what the seal says now.
void sealSettingsOfVersion1(SQLiteConnection& connection) {
  connection.execute(
      "UPDATE favorites_seal SET"
      " wereSet = EXISTS (SELECT 1 FROM settings WHERE key = 'Nimbo.Favorites.wereSet' AND value),"
      " lostWith = (SELECT value FROM settings WHERE key = 'Nimbo.Favorites.lostWith')");
}

/// Whether these were all of them.
bool copyFavorites(SQLiteConnection& from, SQLiteConnection& into, std::size_t& count) {
  const bool isSealed = from.integer("PRAGMA user_version") != 1;
  bool isWhole = true;
  SQLiteStatement rows =
      from.prepare(std::string("SELECT ") + (isSealed ? kSealedFavoriteColumns : "id, position, kind, muid, content") +
                   " FROM favorites");
  SQLiteStatement insert = into.prepare(
      "INSERT OR IGNORE INTO favorites(id, position, kind, muid, content)"
      " VALUES (?, ?, ?, ?, ?)");
  while (stepReadable(rows, isWhole)) {
    if (isSealed && !favoriteFits(rows)) {
      isWhole = false;
      continue;
    }
    insertColumns(insert, rows, 5);
    ++count;
  }
  if (!isSealed) {
    sealSettingsOfVersion1(into);
    return isWhole;
  }
  SQLiteStatement said = from.prepare("SELECT wereSet, lostWith FROM favorites_seal WHERE id = 1");
  if (!said.step()) return false;
  SQLiteStatement keep = into.prepare("UPDATE favorites_seal SET wereSet = ?, lostWith = ?");
  insertColumns(keep, said, 2);
  return isWhole && favoritesFit(from);
}

/// What version 3 added.
std::string tablesOfWhatWasToldAndSeen(const std::string& kind) {
  const std::string create = "CREATE " + kind + "TABLE ";
  // `content` is JSON, `date` microseconds since 1970.
  return create +
         "seen(muid INTEGER PRIMARY KEY, digest INTEGER NOT NULL, content TEXT NOT NULL, date INTEGER NOT NULL);" +
         create + "told(muid INTEGER PRIMARY KEY, content TEXT NOT NULL);" +
         // One row, once something was told.
         create + "telling(id INTEGER PRIMARY KEY, content TEXT NOT NULL);";
}

void addChecksums(SQLiteConnection& connection) {
  connection.execute(
      "ALTER TABLE favorites ADD COLUMN checksum INTEGER NOT NULL DEFAULT 0;"
      "CREATE TABLE favorites_seal(id INTEGER PRIMARY KEY, count INTEGER, digest INTEGER, wereSet INTEGER, lostWith);"
      "INSERT INTO favorites_seal VALUES (1, 0, 0, 0, NULL);");
  sealSettingsOfVersion1(connection);
  connection.execute("DELETE FROM settings WHERE key IN ('Nimbo.Favorites.wereSet', 'Nimbo.Favorites.lostWith')");
  sealFavorites(connection);
}

/// Temporary tables stand before those of the file.
void showChecksums(SQLiteConnection& connection) {
  connection.execute(
      "CREATE TEMP TABLE favorites AS SELECT id, position, kind, muid, content, 0 AS checksum FROM main.favorites;"
      "CREATE TEMP TABLE favorites_seal(id, count, digest, wereSet, lostWith);"
      "INSERT INTO favorites_seal VALUES (1, 0, 0, 0, NULL);");
  sealSettingsOfVersion1(connection);
  sealFavorites(connection);
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
      "                       content, checksum INTEGER NOT NULL DEFAULT 0);"
      "CREATE TABLE favorites_seal(id INTEGER PRIMARY KEY, count INTEGER, digest INTEGER, wereSet INTEGER, lostWith);"
      "INSERT INTO favorites_seal VALUES (1, 0, 0, 0, NULL);"
      // One entry a row as JSON, the newest last.
      "CREATE TABLE analytics(id INTEGER PRIMARY KEY, content TEXT NOT NULL);");
  connection.execute(tablesOfWhatWasToldAndSeen("").c_str());
  sealFavorites(connection);
  connection.execute(("PRAGMA user_version = " + std::to_string(kStateSchemaVersion)).c_str());
  transaction.commit();
}

void upgradeStateSchema(SQLiteConnection& connection, std::int64_t from, Upgrade upgrade) {
  if (upgrade == Upgrade::shown) {
    connection.execute("PRAGMA temp_store = MEMORY");
    if (from == 1) showChecksums(connection);
    connection.execute(tablesOfWhatWasToldAndSeen("TEMP ").c_str());
    return;
  }
  {
    SQLiteTransaction transaction(connection, SQLiteTransaction::Kind::writing);
    if (from == 1) addChecksums(connection);
    connection.execute(tablesOfWhatWasToldAndSeen("").c_str());
    connection.execute(("PRAGMA user_version = " + std::to_string(kStateSchemaVersion)).c_str());
    transaction.commit();
  }
  connection.writeBackLog();
}

SalvagedCounts salvageState(const std::filesystem::path& damaged, const std::filesystem::path& aside,
                            SQLiteConnection& into) {
  SQLiteTransaction transaction(into, SQLiteTransaction::Kind::writing);
  SalvagedCounts counts;
  bool hasAllFavorites = false;
  std::unique_ptr<SQLiteConnection> from;
  const auto ifReadable = [](const auto& copy) {
    try {
      copy();
    } catch (const SQLiteFailure& failure) {
      if (failure.code() == SQLITE_FULL) throw;  // of the copy
    }
  };
  ifReadable([&] {
    from = std::make_unique<SQLiteConnection>(damaged, SQLiteConnection::Access::readWrite, kMaximumStateValueBytes);
    from->keepLogOnClose();
  });
  if (from) {
    ifReadable([&] { copySettings(*from, into, counts.settings); });
    ifReadable([&] { hasAllFavorites = copyFavorites(*from, into, counts.favorites); });
  }
  if (!hasAllFavorites) {
    SQLiteStatement mark = into.prepare("UPDATE favorites_seal SET lostWith = ?");
    mark.bind(1, aside.native());
    mark.step();
  }
  into.execute("DELETE FROM settings WHERE key IN ('Nimbo.Favorites.wereSet', 'Nimbo.Favorites.lostWith')");
  sealFavorites(into);
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

fs::file_type typeOf(const fs::path& path) {
  std::error_code ignored;
  return fs::symlink_status(path, ignored).type();
}

bool isMissing(const fs::path& path) { return typeOf(path) == fs::file_type::not_found; }

/// Makes the file where it is missing, for its owner only; SQLite gives the files that it makes beside it the same
/// mode. One that exists is not touched: closing it would drop the locks that this process may hold on it.
ErrorRef makeFile(const fs::path& path) {
  const FileDescriptor made(::open(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0600));
  return !made && errno != EEXIST ? fileError("make", path, errno) : nullptr;
}

/// Removes a database and what SQLite keeps beside it.
void removeDatabase(const fs::path& path) {
  for (const char* suffix : {"", "-wal", "-shm"}) ::unlink(withSuffix(path, suffix).c_str());
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
  if (isMissing(_path) && !isMissing(pathOfNew())) putInPlace(pathOfNew(), nameForDamaged());
  for (const fs::path& left : {pathOfNew(), pathOfFirst()}) removeDatabase(left);  // by a killed process
  if (const fs::file_type type = typeOf(_path);
      type != fs::file_type::regular && type != fs::file_type::not_found && type != fs::file_type::none)
    return failed(error(StateDatabaseError::cannotRead,
                        "Cannot read " + _path.native() + ": it is " +
                            (type == fs::file_type::symlink ? "a link" : "no file") +
                            ". Move it away, or choose another state folder.",
                        _path));
  try {
    return openLocked(purpose);
  } catch (const SQLiteFailure& failure) {
    if (!failure.meansDamage()) return failed(errorOfFailure(failure, purpose));
  }
  return replaceLocked();
}

StateDatabaseFile::Opened StateDatabaseFile::openLocked(Purpose purpose) {
  if (purpose == Purpose::writing && isMissing(_path)) {
    // Whole before it has its name: an empty file is one that lost everything, not one that was never written to.
    if (ErrorRef error = makeNew(pathOfFirst(), [](SQLiteConnection&) {})) return failed(std::move(error));
    putInPlace(pathOfFirst(), nameForDamaged());
  }
  Opened opened;
  opened.connection = connect(opened.isSnapshot);
  const std::int64_t version = opened.connection->integer("PRAGMA user_version");
  if (version > kStateSchemaVersion)
    return failed(error(StateDatabaseError::newerVersion,
                        _path.native() + " was written by a newer version of this program. Install that version, or "
                                         "choose another state folder.",
                        _path));
  if (version == kStateSchemaVersion) return opened;
  if (version > 0 && version < kStateSchemaVersion) {
    upgrade(opened, version, purpose);
    return opened;
  }
  if (opened.connection->integer("SELECT count(*) FROM sqlite_schema") == 0)
    throw SQLiteFailure(SQLITE_NOTADB, "it is empty");
  return failed(error(StateDatabaseError::foreign,
                      _path.native() + " is a database of another program. Move it away, or choose another state "
                                       "folder.",
                      _path));
}

void StateDatabaseFile::upgrade(Opened& opened, std::int64_t from, Purpose purpose) const {
  try {
    if (!opened.isSnapshot) return upgradeStateSchema(*opened.connection, from, Upgrade::kept);
  } catch (const SQLiteFailure& failure) {
    if (purpose == Purpose::writing || failure.meansDamage()) throw;
    opened.isSnapshot = true;  // the next access tries again
  }
  upgradeStateSchema(*opened.connection, from, Upgrade::shown);
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
    const bool isDiskFull = failure.code() == SQLITE_IOERR || failure.code() == SQLITE_FULL;
    if (!isDiskFull && failure.code() != SQLITE_CANTOPEN && failure.code() != SQLITE_READONLY) throw;
    isSnapshot = true;
    if (isDiskFull)
      return std::make_unique<SQLiteConnection>(_path, SQLiteConnection::Access::alone, kMaximumStateValueBytes);
    std::error_code noLog;
    const std::uintmax_t logBytes = fs::file_size(withSuffix(_path, "-wal"), noLog);
    if (mayWriteTo(_folder) || (!noLog && logBytes > 0)) throw;
  }
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

fs::path StateDatabaseFile::pathOfFirst() const { return withSuffix(_path, ".first"); }

ErrorRef StateDatabaseFile::makeNew(const fs::path& path, const std::function<void(SQLiteConnection&)>& fill) const {
  removeDatabase(path);
  if (ErrorRef error = makeFile(path)) return error;
  SQLiteConnection connection(path, SQLiteConnection::Access::readWrite, kMaximumStateValueBytes);
  createStateSchema(connection);
  fill(connection);
  return nullptr;
}

void StateDatabaseFile::putInPlace(const fs::path& made, const fs::path& aside) const {
  // A log there is belongs to the file before; its index is made anew wherever it is missing.
  ::rename(withSuffix(_path, "-wal").c_str(), withSuffix(aside, "-wal").c_str());
  ::unlink(withSuffix(_path, "-shm").c_str());
  ::rename(made.c_str(), _path.c_str());
}

StateDatabaseFile::Opened StateDatabaseFile::replaceLocked() {
  // The new one is whole before the damaged one goes: whenever this is cut short, the next opening finds the damaged
  // one and begins again, or finds it gone and puts the new one in its place.
  const fs::path aside = nameForDamaged();
  SalvagedCounts counts;
  Opened opened;
  try {
    if (ErrorRef error =
            makeNew(pathOfNew(), [&](SQLiteConnection& fresh) { counts = salvageState(_path, aside, fresh); }))
      return failed(std::move(error));
    if (::rename(_path.c_str(), aside.c_str()) != 0) return failed(fileError("set aside the damaged", _path, errno));
    putInPlace(pathOfNew(), aside);
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
