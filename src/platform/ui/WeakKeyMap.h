#pragma once

#include <algorithm>
#include <memory>
#include <utility>
#include <vector>

namespace nimbo {

/// A map that does not keep its keys alive, compared by identity, in the order in which they came. The entry of a key
/// that has died is gone. Not thread-safe.
template <class Key, class Value>
class WeakKeyMap {
 public:
  /// Replaces the value of a key that is there.
  void setObject_forKey(Value value, const std::shared_ptr<Key>& key) {
    std::erase_if(_entries, [](const auto& entry) { return entry.first.expired(); });
    const auto found = std::ranges::find_if(_entries, [&](const Entry& entry) { return isKey(entry, key.get()); });
    if (found == _entries.end())
      _entries.emplace_back(key, std::move(value));
    else
      found->second = std::move(value);
  }

  /// Null for a key that is not there. Valid until the map changes.
  const Value* objectForKey(const Key* key) const {
    const auto found = std::ranges::find_if(_entries, [key](const Entry& entry) { return isKey(entry, key); });
    return found == _entries.end() ? nullptr : &found->second;
  }

  void removeObjectForKey(const Key* key) {
    std::erase_if(_entries, [key](const auto& entry) { return isKey(entry, key); });
  }

  /// The living keys with their values, for a walk during which the map may change.
  std::vector<std::pair<std::shared_ptr<Key>, Value>> snapshot() const {
    std::vector<std::pair<std::shared_ptr<Key>, Value>> living;
    for (const auto& [weakKey, value] : _entries)
      if (auto key = weakKey.lock()) living.emplace_back(std::move(key), value);
    return living;
  }

 private:
  using Entry = std::pair<std::weak_ptr<Key>, Value>;
  static bool isKey(const Entry& entry, const Key* key) {
    const auto living = entry.first.lock();
    return living && living.get() == key;
  }

  std::vector<Entry> _entries;
};

}  // namespace nimbo
