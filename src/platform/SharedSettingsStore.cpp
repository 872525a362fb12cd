#include "platform/SharedSettingsStore.h"

namespace nimbo {

namespace {

template <class T>
std::optional<T> valueOfType(const SharedSettingsStore& store, std::string_view key) {
  auto value = store.valueForKey(key);
  if (!value || !std::holds_alternative<T>(*value)) return std::nullopt;
  return std::get<T>(std::move(*value));
}

}  // namespace

bool SharedSettingsStore::boolForKey(std::string_view key) const {
  return valueOfType<bool>(*this, key).value_or(false);
}

std::optional<Bytes> SharedSettingsStore::dataForKey(std::string_view key) const {
  return valueOfType<Bytes>(*this, key);
}

std::optional<std::string> SharedSettingsStore::stringForKey(std::string_view key) const {
  return valueOfType<std::string>(*this, key);
}

}  // namespace nimbo
