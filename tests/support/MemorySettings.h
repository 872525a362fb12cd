#pragma once

#include <map>
#include <mutex>

#include "platform/SharedSettingsStore.h"

namespace nimbo {

/// Shared settings in memory; every store is a view of the same values. Any thread.
class MemorySettings final : public SharedSettings {
 public:
  std::shared_ptr<SharedSettingsStore> groupStore() override { return std::make_shared<Store>(*this); }

  void setFailsWrites(bool fails) {
    const std::lock_guard guard(_lock);
    _failsWrites = fails;
  }

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
      return change([&](auto& values) { values.insert_or_assign(std::string(key), value); });
    }
    ErrorRef removeValueForKey(std::string_view key) override {
      return change([&](auto& values) { values.erase(std::string(key)); });
    }

   private:
    template <class Change>
    ErrorRef change(Change apply) {
      const std::lock_guard guard(_settings._lock);
      if (_settings._failsWrites) return Error::errorWithDomain_code_reason("MemorySettings", 1, "told to fail");
      apply(_settings._values);
      return nullptr;
    }
    MemorySettings& _settings;
  };

  std::mutex _lock;
  std::map<std::string, SharedSettingsStore::Value, std::less<>> _values;
  bool _failsWrites = false;
};

}  // namespace nimbo
