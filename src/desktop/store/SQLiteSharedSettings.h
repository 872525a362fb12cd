#pragma once

#include <memory>
#include <mutex>

#include "desktop/store/StateDatabase.h"
#include "platform/SharedSettingsStore.h"

namespace nimbo {

/// The shared settings in the state database. A value of more than 100 MiB is neither kept nor read.
class SQLiteSharedSettings final : public SharedSettings {
 public:
  /// Of the last change; null where it succeeded.
  struct Failure {
    std::mutex lock;
    ErrorRef error;
  };

  /// Throws std::invalid_argument without a database.
  explicit SQLiteSharedSettings(std::shared_ptr<StateDatabase> database);

  std::shared_ptr<SharedSettingsStore> groupStore() override;

  /// Why the last change by this object's stores failed; null where it did not, or there was none. Any thread.
  ErrorRef lastFailure() const {
    const std::lock_guard guard(_failure->lock);
    return _failure->error;
  }

 private:
  std::shared_ptr<StateDatabase> _database;
  std::shared_ptr<Failure> _failure = std::make_shared<Failure>();
};

}  // namespace nimbo
