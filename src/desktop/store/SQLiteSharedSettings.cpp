#include "desktop/store/SQLiteSharedSettings.h"

#include <stdexcept>

#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

class Store final : public SharedSettingsStore {
 public:
  Store(std::shared_ptr<StateDatabase> database, std::shared_ptr<SQLiteSharedSettings::Failure> failure)
      : _database(std::move(database)), _failure(std::move(failure)) {}

  std::optional<Value> valueForKey(std::string_view key) const override {
    std::optional<Value> value;
    const ErrorRef error = _database->read([&](SQLiteConnection& connection) -> ErrorRef {
      SQLiteStatement query = connection.prepare("SELECT value FROM settings WHERE key = ?");
      query.bind(1, key);
      if (query.step()) value = valueOfRow(query);
      return nullptr;
    });
    if (error)
      writeLog({kDefaultLogSubsystem, "Settings"}, LogLevel::error, "Unable to read the setting %{private}@: %@",
               {key, error->reason()});
    return value;
  }

  ErrorRef setValue_forKey(const Value& value, std::string_view key) override {
    return change([&](SQLiteConnection& connection) -> ErrorRef {
      SQLiteStatement insert = connection.prepare("INSERT OR REPLACE INTO settings(key, value) VALUES (?, ?)");
      insert.bind(1, key);
      if (const auto* yes = std::get_if<bool>(&value))
        insert.bind(2, std::int64_t{*yes});
      else if (const auto* text = std::get_if<std::string>(&value))
        insert.bind(2, *text);
      else
        insert.bind(2, std::get<Bytes>(value));
      insert.step();
      return nullptr;
    });
  }

  ErrorRef removeValueForKey(std::string_view key) override {
    return change([&](SQLiteConnection& connection) -> ErrorRef {
      SQLiteStatement remove = connection.prepare("DELETE FROM settings WHERE key = ?");
      remove.bind(1, key);
      remove.step();
      return nullptr;
    });
  }

 private:
  ErrorRef change(const StateDatabase::Work& work) {
    ErrorRef error = _database->write(work);
    const std::lock_guard guard(_failure->lock);
    return _failure->error = std::move(error);
  }

  static std::optional<Value> valueOfRow(const SQLiteStatement& row) {
    switch (row.type(0)) {
      case SQLiteStatement::ColumnType::integer:
        return row.integer(0) != 0;
      case SQLiteStatement::ColumnType::text:
        return row.text(0);
      case SQLiteStatement::ColumnType::blob:
        return row.bytes(0);
      case SQLiteStatement::ColumnType::real:
      case SQLiteStatement::ColumnType::null:
        break;
    }
    return std::nullopt;
  }

  std::shared_ptr<StateDatabase> _database;
  std::shared_ptr<SQLiteSharedSettings::Failure> _failure;
};

}  // namespace

SQLiteSharedSettings::SQLiteSharedSettings(std::shared_ptr<StateDatabase> database) : _database(std::move(database)) {
  if (!_database) throw std::invalid_argument("shared settings need a database");
}

std::shared_ptr<SharedSettingsStore> SQLiteSharedSettings::groupStore() {
  return std::make_shared<Store>(_database, _failure);
}

}  // namespace nimbo
