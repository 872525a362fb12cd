#pragma once

#include <fcntl.h>
#include <sys/file.h>

#include <cerrno>
#include <filesystem>
#include <functional>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/raii/SQLite.h"
#include "platform/SystemServices.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// Keeps every other FolderLock on the same folder waiting, in this and in other processes. Locks nothing where the
/// folder cannot be opened or its file system has no locks.
class FolderLock final {
 public:
  explicit FolderLock(const std::filesystem::path& folder)
      : _folder(::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)) {
    if (!_folder) return;
    while (::flock(_folder.get(), LOCK_EX) != 0 && errno == EINTR) {
    }
  }

 private:
  FileDescriptor _folder;
};

/// Version of the tables, kept as the database's user_version. Version 1 had no checksums, version 2 nothing of what
/// was seen and told.
inline constexpr std::int64_t kStateSchemaVersion = 3;

/// Puts the tables into an empty database, which from then on keeps a write-ahead log: all or nothing. Throws
/// SQLiteFailure.
void createStateSchema(SQLiteConnection& connection);

enum class Upgrade {
  kept,
  shown,  ///< for this connection alone: the file lets nothing be written
};

/// Gives the tables of the earlier version `from` what they lack: all or nothing. Throws SQLiteFailure.
void upgradeStateSchema(SQLiteConnection& connection, std::int64_t from, Upgrade upgrade);

struct SalvagedCounts {
  std::size_t favorites = 0;
  std::size_t settings = 0;
};

/// Copies the favourites and settings that can still be read, and fit their checksums, in a damaged file, which stays
/// as it is, and whose tables may be missing; `aside` is the name that it will have, and that the copy names as where
/// favourites were lost, unless all were copied. Throws SQLiteFailure when the copies cannot be kept.
SalvagedCounts salvageState(const std::filesystem::path& damaged, const std::filesystem::path& aside,
                            SQLiteConnection& into);

class SQLiteFailure;

/// Domain of the errors of the state database; the codes are StateDatabaseError.
inline constexpr std::string_view kStateDatabaseErrorDomain = "org.nimbo.StateDatabase";

enum class StateDatabaseError : std::int64_t {
  cannotRead = 1,
  cannotWrite = 2,
  newerVersion = 3,  ///< written by a newer version of the program; left as it is
  foreign = 4,       ///< a database of another program; left as it is
  setAside = 5,      ///< was damaged; kept under another name, a new one begun
};

/// Longest value that is read or written, with what a row adds to it.
inline constexpr int kMaximumStateValueBytes = 100 * 1024 * 1024 + 64 * 1024;

/// The file of the state database: makes it, opens it, and sets a damaged one aside under a dated name, with whatever
/// can still be read of it copied into a new one. Everything here happens under a lock on the folder, so that
/// processes that start at once do it one after the other. One thread at a time.
class StateDatabaseFile final {
 public:
  enum class Purpose { reading, writing };

  struct Opened {
    std::unique_ptr<SQLiteConnection> connection;  ///< null after an error, or when there is nothing to read yet
    ErrorRef error;
    ErrorRef notice;          ///< for the user: a damaged database was set aside
    bool isSnapshot = false;  ///< the connection does not see later changes
  };

  /// Touches nothing. `clock` outlives this.
  StateDatabaseFile(std::filesystem::path folder, const Clock& clock);

  const std::filesystem::path& path() const { return _path; }

  /// Opens the file; for writing it is made where it is missing, readable and writable by its owner only. Where the
  /// folder lets nothing be written the file is opened for reading, if it can be.
  Opened open(Purpose purpose);

  /// Sets the file aside that `damaged` has open, unless another process has done so, and opens the new one.
  Opened replaceDamaged(std::unique_ptr<SQLiteConnection> damaged);

  /// What SQLite could not do as a sentence with the file and an advice.
  ErrorRef errorOfFailure(const SQLiteFailure& failure, Purpose purpose) const;

 private:
  // Each of these needs the folder's lock, and may throw SQLiteFailure.
  Opened openLocked(Purpose purpose);
  std::unique_ptr<SQLiteConnection> connect(bool& isSnapshot) const;
  void upgrade(Opened& opened, std::int64_t from, Purpose purpose) const;
  Opened replaceLocked();
  /// Makes a database at `path`, in place of what is there.
  ErrorRef makeNew(const std::filesystem::path& path, const std::function<void(SQLiteConnection&)>& fill) const;
  /// Gives the file at `made` its name, once there is none of that name; the log of one before goes to `aside`.
  void putInPlace(const std::filesystem::path& made, const std::filesystem::path& aside) const;

  ErrorRef error(StateDatabaseError code, std::string reason, const std::filesystem::path& subject) const;
  /// Where a new file is made while the damaged one is still there.
  std::filesystem::path pathOfNew() const;
  /// Where the very first one is made.
  std::filesystem::path pathOfFirst() const;
  /// A name for a damaged file that nothing has yet: "state.sqlite.broken-2026-01-05T12-00-00".
  std::filesystem::path nameForDamaged() const;

  std::filesystem::path _folder;
  std::filesystem::path _path;
  const Clock& _clock;
};

}  // namespace nimbo
