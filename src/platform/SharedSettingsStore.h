#pragma once

#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <variant>

#include "platform/foundation/Boxed.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// Settings that the widget process and its hosts share: booleans, texts and bytes by key. Each instance is a view of
/// the same stored settings; a change by another process shows in the next read. Any thread.
class SharedSettingsStore {
 public:
  using Value = std::variant<bool, std::string, Bytes>;

  virtual ~SharedSettingsStore() = default;

  /// Absent when the key is not set or the store cannot be read (which is logged).
  virtual std::optional<Value> valueForKey(std::string_view key) const = 0;
  /// Stores or replaces a value. Null on success; on failure the old value stays.
  virtual ErrorRef setValue_forKey(const Value& value, std::string_view key) = 0;
  /// Null on success, also when there was nothing to remove.
  virtual ErrorRef removeValueForKey(std::string_view key) = 0;

  /// NO when the key is absent or holds something else.
  bool boolForKey(std::string_view key) const;
  /// Absent when the key is absent or holds something else.
  std::optional<Bytes> dataForKey(std::string_view key) const;
  /// Absent when the key is absent or holds something else.
  std::optional<std::string> stringForKey(std::string_view key) const;
};

/// Makes the instances.
class SharedSettings {
 public:
  virtual ~SharedSettings() = default;
  /// A new instance over the settings group that the widget shares with its host. Never null. Any thread.
  virtual std::shared_ptr<SharedSettingsStore> groupStore() = 0;
};

}  // namespace nimbo
