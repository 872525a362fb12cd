#pragma once

#include <map>
#include <mutex>

#include "platform/SharedSettingsStore.h"

namespace nimbo {

/// Shared settings in memory; every store is a view of the same values. Any thread.
class MemorySettings final : public SharedSettings {
 public:
  std::shared_ptr<SharedSettingsStore> groupStore() override { return std::make_shared<Store>(*this); }

  bool writesFail = false;

 private:
  class Store final : public SharedSettingsStore {
   public:
    explicit Store(MemorySettings& settings) : _settings(settings) {}

    std::optional<Value> valueForKey(std::string_view key) const override {
      const std::lock_guard guard(_settings._lock);
      const auto found = _settings._values.find(key);
      return found == _settings._values.end() ? std::nullopt : std::optional(found->second);
    }
    ErrorRef setValue_forKey(const Value& value, std::string_view key) override {
      if (_settings.writesFail) return Error::errorWithDomain_code_reason("MemorySettings", 1, "the disk is full");
      const std::lock_guard guard(_settings._lock);
      _settings._values.insert_or_assign(std::string(key), value);
      return nullptr;
    }
    ErrorRef removeValueForKey(std::string_view key) override {
      const std::lock_guard guard(_settings._lock);
      _settings._values.erase(std::string(key));
      return nullptr;
    }

   private:
    MemorySettings& _settings;
  };

  std::mutex _lock;
  std::map<std::string, SharedSettingsStore::Value, std::less<>> _values;
};

}  // namespace nimbo
