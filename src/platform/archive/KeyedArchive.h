#pragma once

#include <memory>
#include <optional>
#include <span>

#include "platform/archive/SecureCoding.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// Key of an archive's root object.
inline constexpr std::string_view kKeyedArchiveRootObjectKey = "root";

/// Domain of archive errors.
inline constexpr std::string_view kKeyedArchiveErrorDomain = "KeyedArchiveErrorDomain";

/// What a decoder does when something does not decode.
enum class DecodingFailurePolicy {
  raiseException,     ///< throws std::runtime_error; the policy until another is set
  setErrorAndReturn,  ///< ends decoding; the top-level operation answers the error
};

/// One archive being read. Main thread only.
class KeyedUnarchiver {
 public:
  struct Decoded {
    ObjectRef object;  ///< null when absent, unusable, failed, or of a class that was not asked for
    ErrorRef error;    ///< null unless decoding failed
  };

  virtual ~KeyedUnarchiver() = default;

  /// Objects stored under `name` are decoded as `archivableClass`.
  virtual void setClass_forClassName(const ArchivableClass& archivableClass, std::string_view name) = 0;
  virtual void setDecodingFailurePolicy(DecodingFailurePolicy policy) = 0;
  virtual Decoded decodeTopLevelObjectOfClasses_forKey(const AllowedClasses& classes, std::string_view key) = 0;
  virtual void finishDecoding() = 0;
};

/// Object graphs as bytes: keyed, self-describing, the same bytes for the same objects.
class KeyedArchive {
 public:
  virtual ~KeyedArchive() = default;

  /// The archive of `root`, under `kKeyedArchiveRootObjectKey`. With secure coding required, as everywhere here, every
  /// object is a boxed value, an Error or a SecureCoding one; an error for any other.
  virtual Outcome<Bytes> archivedDataWithRootObject(const ObjectRef& root, bool requiringSecureCoding) = 0;

  /// A decoder over a copy of the bytes, or null when they are no archive.
  virtual std::unique_ptr<KeyedUnarchiver> unarchiverForReadingFromData(std::span<const std::uint8_t> bytes) = 0;
};

}  // namespace nimbo
