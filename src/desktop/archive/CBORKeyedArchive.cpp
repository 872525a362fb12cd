#include "desktop/archive/CBORKeyedArchive.h"

#include "desktop/archive/ArchiveParser.h"
#include "desktop/archive/CBORKeyedUnarchiver.h"

namespace nimbo {

std::unique_ptr<KeyedUnarchiver> CBORKeyedArchive::unarchiverForReadingFromData(std::span<const std::uint8_t> bytes) {
  auto opened = openData(bytes);
  return opened ? std::move(*opened) : nullptr;
}

Outcome<std::unique_ptr<KeyedUnarchiver>> CBORKeyedArchive::openData(std::span<const std::uint8_t> bytes) {
  auto parsed = parseArchive(bytes);
  if (!parsed) return parsed.error();
  return std::unique_ptr<KeyedUnarchiver>(std::make_unique<CBORKeyedUnarchiver>(std::move(*parsed)));
}

}  // namespace nimbo
