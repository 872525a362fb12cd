#pragma once

#include "platform/archive/KeyedArchive.h"

namespace nimbo {

/// Keyed archives as deterministic CBOR: sorted keys, definite lengths. Any thread.
class CBORKeyedArchive final : public KeyedArchive {
 public:
  /// An object that is neither a boxed value nor an Error nor a SecureCoding one makes the archive fail, whether secure
  /// coding is required or not; so do texts that are not UTF-8 and archives that reading would refuse as too large.
  Outcome<Bytes> archivedDataWithRootObject(const ObjectRef& root, bool requiringSecureCoding) override;
  std::unique_ptr<KeyedUnarchiver> unarchiverForReadingFromData(std::span<const std::uint8_t> bytes) override;

  /// As `unarchiverForReadingFromData`, never null; an error says what is wrong with bytes that are no archive, and
  /// where.
  static Outcome<std::unique_ptr<KeyedUnarchiver>> openData(std::span<const std::uint8_t> bytes);
};

}  // namespace nimbo
