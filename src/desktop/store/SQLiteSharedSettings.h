#pragma once

#include "desktop/store/StateDatabase.h"
#include "platform/SharedSettingsStore.h"

namespace nimbo {

/// The shared settings in the state database. A value of more than 100 MiB is neither kept nor read.
class SQLiteSharedSettings final : public SharedSettings {
 public:
  /// Throws std::invalid_argument without a database.
  explicit SQLiteSharedSettings(std::shared_ptr<StateDatabase> database);

  std::shared_ptr<SharedSettingsStore> groupStore() override;

 private:
  std::shared_ptr<StateDatabase> _database;
};

}  // namespace nimbo
