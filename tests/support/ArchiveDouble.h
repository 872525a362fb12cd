#pragma once

#include "platform/archive/KeyedArchive.h"

namespace nimbo {

/// Archives to a readable text that nothing reads back: equal objects give equal bytes.
class ArchiveDouble final : public KeyedArchive {
 public:
  Outcome<Bytes> archivedDataWithRootObject(const ObjectRef& root, bool requiringSecureCoding) override;
  std::unique_ptr<KeyedUnarchiver> unarchiverForReadingFromData(std::span<const std::uint8_t>) override {
    return nullptr;
  }
  bool fails = false;
};

}  // namespace nimbo
