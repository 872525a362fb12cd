#pragma once

#include "platform/archive/KeyedArchive.h"

namespace nimbo {

/// Keyed archives as deterministic CBOR: sorted keys, definite lengths. Any thread.
class CBORKeyedArchive final : public KeyedArchive {
 public:
  /// An object that is neither a boxed value nor an Error nor a SecureCoding one makes the archive fail, whether secure
  /// coding is required or not; so do texts that are not UTF-8 and archives that reading would refuse as too large.
  Archived archivedDataWithRootObject(const ObjectRef& root, bool requiringSecureCoding) override;
  std::unique_ptr<KeyedUnarchiver> unarchiverForReadingFromData(std::span<const std::uint8_t> bytes) override;

  struct Opened {
    std::unique_ptr<KeyedUnarchiver> unarchiver;  ///< null when the bytes are no archive
    ErrorRef error;                               ///< what is wrong with them, and where
  };

  /// As `unarchiverForReadingFromData`, with the reason.
  static Opened openData(std::span<const std::uint8_t> bytes);
};

}  // namespace nimbo
