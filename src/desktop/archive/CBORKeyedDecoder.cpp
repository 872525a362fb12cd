#include "desktop/archive/CBORKeyedDecoder.h"

#include <utility>

#include "desktop/archive/CBORKeyedUnarchiver.h"

namespace nimbo {

using nlohmann::json;

const json* CBORKeyedDecoder::field(std::string_view key, bool (*isKind)(const json&), const char* kind) {
  const auto value = _fields.find(key);
  if (value == _fields.end() || _unarchiver.hasFailed()) return nullptr;
  if (isKind(*value)) return &*value;
  failAtKey(key, std::string("not ") + kind + " but of the kind \"" + value->type_name() + "\"");
  return nullptr;
}

void CBORKeyedDecoder::failAtKey(std::string_view key, const std::string& reason) {
  const ArchivePath::Scope scope(_unarchiver.path(), std::string(key));
  _unarchiver.fail(reason);
}

void CBORKeyedDecoder::failWithReason(std::string reason) { _unarchiver.fail(reason); }

bool CBORKeyedDecoder::containsValueForKey(std::string_view key) const { return _fields.contains(key); }

ObjectRef CBORKeyedDecoder::decodeObjectOfClasses_forKey(const AllowedClasses& classes, std::string_view key) {
  const auto value = _fields.find(key);
  if (value == _fields.end()) return nullptr;
  const ArchivePath::Scope scope(_unarchiver.path(), std::string(key));
  return _unarchiver.objectOf(*value, classes);
}

bool CBORKeyedDecoder::decodeBoolForKey(std::string_view key) {
  const json* value = field(
      key, [](const json& kind) { return kind.is_boolean(); }, "a boolean");
  return value && value->get<bool>();
}

std::int64_t CBORKeyedDecoder::decodeInt64ForKey(std::string_view key) {
  const auto isInt64 = [](const json& kind) {
    return kind.is_number_integer() &&
           !(kind.is_number_unsigned() && !std::in_range<std::int64_t>(kind.get<std::uint64_t>()));
  };
  const json* value = field(key, isInt64, "a signed 64-bit integer");
  return value ? value->get<std::int64_t>() : 0;
}

std::uint64_t CBORKeyedDecoder::decodeUInt64ForKey(std::string_view key) {
  const auto isUInt64 = [](const json& kind) {
    return kind.is_number_unsigned() || (kind.is_number_integer() && kind.get<std::int64_t>() >= 0);
  };
  const json* value = field(key, isUInt64, "an unsigned 64-bit integer");
  return value ? value->get<std::uint64_t>() : 0;
}

double CBORKeyedDecoder::decodeDoubleForKey(std::string_view key) {
  const json* value = field(
      key, [](const json& kind) { return kind.is_number(); }, "a number");
  return value ? value->get<double>() : 0;
}

std::optional<std::string> CBORKeyedDecoder::decodeStringForKey(std::string_view key) {
  const json* value = field(
      key, [](const json& kind) { return kind.is_string(); }, "a text");
  return value ? std::optional(value->get<std::string>()) : std::nullopt;
}

std::optional<Date> CBORKeyedDecoder::decodeDateForKey(std::string_view key) {
  const auto date = std::dynamic_pointer_cast<const BoxedDate>(decodeObjectOfClasses_forKey({&kDateClass}, key));
  return date ? std::optional(date->value()) : std::nullopt;
}

std::optional<Bytes> CBORKeyedDecoder::decodeBytesForKey(std::string_view key) {
  const json* value = field(
      key, [](const json& kind) { return kind.is_binary(); }, "a byte string");
  return value ? std::optional<Bytes>(value->get_binary()) : std::nullopt;
}

}  // namespace nimbo
