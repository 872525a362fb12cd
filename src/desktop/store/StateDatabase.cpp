#include "desktop/store/StateDatabase.h"

#include "desktop/raii/SQLite.h"

namespace nimbo {

using Purpose = StateDatabaseFile::Purpose;

StateDatabase::StateDatabase(std::filesystem::path folder, const Clock& clock, Notice notice)
    : _file(std::move(folder), clock), _notice(std::move(notice)) {
  if (!_notice) throw std::invalid_argument("a state database needs somebody to tell of damage");
}

ErrorRef StateDatabase::read(const Work& work) {
  return run(Purpose::reading, [&](SQLiteConnection& connection) {
    SQLiteTransaction transaction(connection, SQLiteTransaction::Kind::reading);
    return work(connection);
  });
}

ErrorRef StateDatabase::write(const Work& work, Durability durability) {
  return run(Purpose::writing, [&](SQLiteConnection& connection) {
    connection.execute(durability == Durability::power ? "PRAGMA synchronous = FULL" : "PRAGMA synchronous = NORMAL");
    {
      SQLiteTransaction transaction(connection, SQLiteTransaction::Kind::writing);
      if (ErrorRef error = work(connection)) return error;
      transaction.commit();
    }
    if (durability == Durability::power) connection.writeBackLog();
    return ErrorRef();
  });
}

ErrorRef StateDatabase::adopt(StateDatabaseFile::Opened opened) {
  _connection = std::move(opened.connection);
  _isSnapshot = opened.isSnapshot;
  if (opened.notice) _notice(opened.notice);
  return opened.error;
}

ErrorRef StateDatabase::run(Purpose purpose, const Work& work) {
  const std::lock_guard guard(_lock);
  // Another process may have set the file aside, or the user deleted it.
  if (_connection && _connection->hasMoved()) _connection.reset();
  if (!_connection)
    if (ErrorRef error = adopt(_file.open(purpose))) return error;
  if (!_connection) return nullptr;
  ErrorRef error;
  try {
    error = work(*_connection);
  } catch (const SQLiteFailure& failure) {
    error = _file.errorOfFailure(failure, purpose);
    if (failure.meansDamage()) {
      StateDatabaseFile::Opened replacement = _file.replaceDamaged(std::move(_connection));
      if (replacement.notice) error = replacement.notice;
      if (ErrorRef second = adopt(std::move(replacement))) error = second;
    }
  }
  if (_isSnapshot) _connection.reset();
  return error;
}

}  // namespace nimbo
