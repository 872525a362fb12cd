#include "desktop/gtfs/StaticFeed.h"

#include <algorithm>

#include "desktop/gtfs/StaticFeedLayout.h"

namespace nimbo {

namespace {

FlatHeader headerOf(std::string_view bytes) { return flatRecordAt<FlatHeader>(bytes, 0); }

std::size_t agencyPosition(std::size_t index) { return sizeof(FlatHeader) + index * sizeof(FlatAgency); }

std::size_t linePosition(const FlatHeader& header, std::size_t index) {
  return agencyPosition(header.agencyCount) + index * sizeof(FlatLine);
}

/// What of the text lies inside the bytes: that is looked at where a text is read, since reading is rare.
std::string_view textOf(std::string_view bytes, const FlatHeader& header, FlatText text) {
  const std::string_view texts = bytes.substr(linePosition(header, header.lineCount));
  return texts.substr(std::min<std::size_t>(text.offset, texts.size()), text.length);
}

std::optional<std::uint32_t> colorOf(std::uint32_t color) {
  if (color == kNoColor) return std::nullopt;
  return color;
}

/// Whether the bytes are a feed's as written, with all the records that the header tells of.
bool isSound(std::string_view bytes) {
  if (bytes.size() < sizeof(FlatHeader)) return false;
  const FlatHeader header = headerOf(bytes);
  return header.magic == kFlatFeedMagic && header.checksum == flatChecksum(bytes.substr(kFlatChecksumEnd)) &&
         linePosition(header, header.lineCount) <= bytes.size();
}

}  // namespace

std::optional<StaticFeed> StaticFeed::fromBytes(std::string bytes) {
  if (!isSound(bytes)) return std::nullopt;
  return StaticFeed(std::move(bytes));
}

std::size_t StaticFeed::agencyCount() const { return headerOf(*_bytes).agencyCount; }
std::size_t StaticFeed::lineCount() const { return headerOf(*_bytes).lineCount; }

StaticAgency StaticFeed::agency(std::size_t index) const {
  const FlatHeader header = headerOf(*_bytes);
  if (index >= header.agencyCount) return {};
  const auto agency = flatRecordAt<FlatAgency>(*_bytes, agencyPosition(index));
  return {textOf(*_bytes, header, agency.id), textOf(*_bytes, header, agency.name),
          static_cast<TransitMode>(agency.sharedMode)};
}

StaticLine StaticFeed::line(std::size_t index) const {
  const FlatHeader header = headerOf(*_bytes);
  const auto line = flatRecordAt<FlatLine>(*_bytes, linePosition(header, index));
  return {line.muid,
          textOf(*_bytes, header, line.routeID),
          textOf(*_bytes, header, line.shortName),
          textOf(*_bytes, header, line.longName),
          colorOf(line.color),
          colorOf(line.textColor),
          line.type,
          line.agency};
}

std::string_view StaticFeed::language() const {
  const FlatHeader header = headerOf(*_bytes);
  return textOf(*_bytes, header, header.language);
}

std::string_view StaticFeed::fingerprint() const {
  const FlatHeader header = headerOf(*_bytes);
  return textOf(*_bytes, header, header.fingerprint);
}

Date StaticFeed::checkedAt() const { return Date(std::chrono::microseconds(headerOf(*_bytes).checkedAt)); }

StaticFeed StaticFeed::checkedAgainAt(Date date) const {
  std::string bytes = *_bytes;
  FlatHeader header = headerOf(bytes);
  header.checkedAt = date.time_since_epoch().count();
  std::memcpy(bytes.data(), &header, sizeof header);
  header.checksum = flatChecksum(std::string_view(bytes).substr(kFlatChecksumEnd));
  std::memcpy(bytes.data(), &header, sizeof header);
  return StaticFeed(std::move(bytes));
}

}  // namespace nimbo
