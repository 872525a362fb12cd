#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "platform/foundation/Boxed.h"

namespace nimbo {

class KeyedDecoder;

/// A class that an archive may hold, as a decoder needs it: its stored name and how an object of it is read.
struct ArchivableClass {
  std::string_view name;
  /// Reads an object from its keyed fields; null when the record holds no usable one. Null for the boxed values and
  /// errors, which archives read themselves.
  ObjectRef (*initWithCoder)(KeyedDecoder& decoder) = nullptr;
};

/// The classes that a decoding accepts, at that place and in the arrays and dictionaries there.
using AllowedClasses = std::vector<const ArchivableClass*>;

/// What archives read themselves. Errors bring whatever archivable values their user info holds.
inline constexpr ArchivableClass kStringClass{"String"};
inline constexpr ArchivableClass kNumberClass{"Number"};
inline constexpr ArchivableClass kDataClass{"Data"};
inline constexpr ArchivableClass kDateClass{"Date"};
inline constexpr ArchivableClass kArrayClass{"Array"};
inline constexpr ArchivableClass kDictionaryClass{"Dictionary"};
inline constexpr ArchivableClass kErrorClass{"Error"};

/// Takes an object's fields, each under a key of its own.
class KeyedEncoder {
 public:
  virtual ~KeyedEncoder() = default;
  /// A null object writes nothing. An object that cannot be archived makes the whole archive fail.
  virtual void encodeObject_forKey(const ObjectRef& object, std::string_view key) = 0;
  virtual void encodeBool_forKey(bool value, std::string_view key) = 0;
  /// An absent text writes nothing.
  virtual void encodeString_forKey(const std::optional<std::string>& value, std::string_view key) = 0;
  virtual void encodeBytes_forKey(std::span<const std::uint8_t> value, std::string_view key) = 0;
};

/// Gives an object's fields. A field of another kind than asked for, or an object of a class that is not allowed,
/// fails the whole decoding; what is answered after that is empty.
class KeyedDecoder {
 public:
  virtual ~KeyedDecoder() = default;
  virtual bool containsValueForKey(std::string_view key) const = 0;
  /// Null when the key is absent or its object decodes to nothing.
  virtual ObjectRef decodeObjectOfClasses_forKey(const AllowedClasses& classes, std::string_view key) = 0;
  /// NO when absent.
  virtual bool decodeBoolForKey(std::string_view key) = 0;
  virtual std::optional<std::string> decodeStringForKey(std::string_view key) = 0;
  virtual std::optional<Bytes> decodeBytesForKey(std::string_view key) = 0;
  /// Makes the decoding fail with this reason, as a field of the wrong kind does.
  virtual void failWithReason(std::string reason) = 0;
};

/// Objects that may stand in an archive.
class SecureCoding {
 public:
  virtual ~SecureCoding() = default;
  /// The class under whose name the object is written.
  virtual const ArchivableClass& archivableClass() const = 0;
  virtual void encodeWithCoder(KeyedEncoder& coder) const = 0;
};

}  // namespace nimbo
