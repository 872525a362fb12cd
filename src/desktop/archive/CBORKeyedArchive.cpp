#include "desktop/archive/CBORKeyedArchive.h"

#include "desktop/archive/ArchiveParser.h"
#include "desktop/archive/CBORKeyedUnarchiver.h"

namespace nimbo {

std::unique_ptr<KeyedUnarchiver> CBORKeyedArchive::unarchiverForReadingFromData(std::span<const std::uint8_t> bytes) {
  return openData(bytes).unarchiver;
}

CBORKeyedArchive::Opened CBORKeyedArchive::openData(std::span<const std::uint8_t> bytes) {
  ParsedArchive parsed = parseArchive(bytes);
  if (parsed.error) return {nullptr, parsed.error};
  return {std::make_unique<CBORKeyedUnarchiver>(std::move(parsed.content)), nullptr};
}

}  // namespace nimbo
