#pragma once

#include <map>
#include <nlohmann/json.hpp>
#include <span>

#include "desktop/archive/ArchiveFormat.h"
#include "platform/archive/KeyedArchive.h"
#include "platform/archive/SecureCoding.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// The values of an archive, not yet objects: its outermost map. Reads CBOR within the bounds of archives: maps with
/// distinct text keys, UTF-8 texts, no tags, nothing after the end. An error for all that is no whole archive of this
/// version.
Outcome<nlohmann::json> parseArchive(std::span<const std::uint8_t> bytes);

class CBORKeyedUnarchiver;

/// The keyed fields of one object of an archive. Lives while the object is read.
class CBORKeyedDecoder final : public KeyedDecoder {
 public:
  CBORKeyedDecoder(const nlohmann::json& fields, CBORKeyedUnarchiver& unarchiver)
      : _fields(fields), _unarchiver(unarchiver) {}

  bool containsValueForKey(std::string_view key) const override;
  ObjectRef decodeObjectOfClasses_forKey(const AllowedClasses& classes, std::string_view key) override;
  bool decodeBoolForKey(std::string_view key) override;
  std::optional<std::string> decodeStringForKey(std::string_view key) override;
  std::optional<Bytes> decodeBytesForKey(std::string_view key) override;
  void failWithReason(std::string reason) override;
  /// 0 when absent.
  std::int64_t decodeInt64ForKey(std::string_view key);

 private:
  /// The field, or null when it is absent, not `isKind`, or the decoding has failed. Another kind fails the decoding.
  const nlohmann::json* field(std::string_view key, bool (*isKind)(const nlohmann::json&), const char* kind);
  void failAtKey(std::string_view key, const std::string& reason);

  const nlohmann::json& _fields;
  CBORKeyedUnarchiver& _unarchiver;
};

/// Reads the objects of a parsed archive.
class CBORKeyedUnarchiver final : public KeyedUnarchiver {
 public:
  /// `content` is the archive's outermost map.
  explicit CBORKeyedUnarchiver(nlohmann::json content) : _content(std::move(content)) {}

  void setClass_forClassName(const ArchivableClass& archivableClass, std::string_view name) override;
  void setDecodingFailurePolicy(DecodingFailurePolicy policy) override { _policy = policy; }
  Decoded decodeTopLevelObjectOfClasses_forKey(const AllowedClasses& classes, std::string_view key) override;
  void finishDecoding() override { _content = nullptr; }

  // For the decoders of the objects.

  /// Null, after `fail`, for a value or class that is not allowed; null also for an object that decodes to nothing.
  ObjectRef objectOf(const nlohmann::json& value, const AllowedClasses& classes);
  /// Keeps the first reason, with the path at this moment; throws it under the policy of raising.
  void fail(const std::string& reason);
  bool hasFailed() const { return !_failure.empty(); }
  ArchivePath& path() { return _path; }

 private:
  /// Of the class as which a value is decoded; empty for what is no object. It points into the value or the
  /// substitutes.
  std::string_view classNameOf(const nlohmann::json& value) const;
  /// Null when it is not one of them.
  static const ArchivableClass* allowedClass(const AllowedClasses& classes, std::string_view name);
  ObjectRef arrayOf(const nlohmann::json& value, const AllowedClasses& classes);
  ObjectRef classedObjectOf(const nlohmann::json& value, const ArchivableClass& archivableClass,
                            const AllowedClasses& classes);
  ObjectRef dateOf(const nlohmann::json& value);
  ObjectRef errorOf(const nlohmann::json& value);
  BoxedDictionary::Entries entriesOf(const nlohmann::json& object, std::string_view key, const AllowedClasses& classes);

  nlohmann::json _content;
  std::map<std::string, ArchivableClass, std::less<>> _substitutes;
  DecodingFailurePolicy _policy = DecodingFailurePolicy::raiseException;
  ArchivePath _path;
  std::string _failure;
};

}  // namespace nimbo
