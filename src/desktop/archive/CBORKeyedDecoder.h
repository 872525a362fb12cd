#pragma once

#include <nlohmann/json.hpp>

#include "platform/archive/SecureCoding.h"

namespace nimbo {

class CBORKeyedUnarchiver;

/// The keyed fields of one object of an archive. Lives while the object is read.
class CBORKeyedDecoder final : public KeyedDecoder {
 public:
  CBORKeyedDecoder(const nlohmann::json& fields, CBORKeyedUnarchiver& unarchiver)
      : _fields(fields), _unarchiver(unarchiver) {}

  bool containsValueForKey(std::string_view key) const override;
  ObjectRef decodeObjectOfClasses_forKey(const AllowedClasses& classes, std::string_view key) override;
  bool decodeBoolForKey(std::string_view key) override;
  std::int64_t decodeInt64ForKey(std::string_view key) override;
  std::uint64_t decodeUInt64ForKey(std::string_view key) override;
  double decodeDoubleForKey(std::string_view key) override;
  std::optional<std::string> decodeStringForKey(std::string_view key) override;
  std::optional<Date> decodeDateForKey(std::string_view key) override;
  std::optional<Bytes> decodeBytesForKey(std::string_view key) override;
  void failWithReason(std::string reason) override;

 private:
  /// The field, or null when it is absent, not `isKind`, or the decoding has failed. Another kind fails the decoding.
  const nlohmann::json* field(std::string_view key, bool (*isKind)(const nlohmann::json&), const char* kind);
  void failAtKey(std::string_view key, const std::string& reason);

  const nlohmann::json& _fields;
  CBORKeyedUnarchiver& _unarchiver;
};

}  // namespace nimbo
