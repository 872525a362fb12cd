#pragma once

#include <map>
#include <mutex>

#include "platform/SharedSettingsStore.h"

namespace nimbo {

/// Shared settings in memory, with one store. Any thread.
class MemorySettings final : public SharedSettings, public SharedSettingsStore {
 public:
  std::shared_ptr<SharedSettingsStore> groupStore() override { return {std::shared_ptr<void>(), this}; }
  std::optional<Value> valueForKey(std::string_view key) const override {
    const std::lock_guard guard(_lock);
    const auto found = _values.find(key);
    return found == _values.end() ? std::nullopt : std::optional(found->second);
  }
  ErrorRef setValue_forKey(const Value& value, std::string_view key) override {
    if (writesFail) return Error::errorWithDomain_code_reason("MemorySettings", 1, "the disk is full");
    const std::lock_guard guard(_lock);
    _values.insert_or_assign(std::string(key), value);
    return nullptr;
  }
  ErrorRef removeValueForKey(std::string_view key) override {
    const std::lock_guard guard(_lock);
    _values.erase(std::string(key));
    return nullptr;
  }

  bool writesFail = false;

 private:
  mutable std::mutex _lock;
  std::map<std::string, Value, std::less<>> _values;
};

}  // namespace nimbo
