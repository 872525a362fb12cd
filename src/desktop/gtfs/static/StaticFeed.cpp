#include "desktop/gtfs/static/StaticFeed.h"

#include <algorithm>

namespace nimbo {

RouteType basicRouteType(RouteType type) {
  switch (type / 100) {
    case 1:
    case 3:  // suburban railway
      return 2;
    case 2:
    case 7:
      return 3;
    case 4:
    case 5:
    case 6:
      return type == 405 ? 12 : 1;
    case 8:
      return 11;
    case 9:
      return 0;
    case 10:
    case 12:
      return 4;
    case 13:
      return 6;
    case 14:
      return 7;
    default:
      return type;
  }
}

bool routeTypeCovers(RouteType selected, RouteType type) {
  if (selected == type || selected == basicRouteType(type)) return true;
  return selected % 100 == 0 && basicRouteType(selected) == type;
}

TransitMode modeOfRouteType(RouteType type) {
  switch (basicRouteType(type)) {
    case 0:
      return TransitMode::tram;
    case 1:
      return TransitMode::subway;
    case 2:
      return TransitMode::rail;
    case 3:
      return TransitMode::bus;
    case 4:
      return TransitMode::ferry;
    case 5:
      return TransitMode::cableTram;
    case 6:
      return TransitMode::aerialLift;
    case 7:
      return TransitMode::funicular;
    case 11:
      return TransitMode::trolleybus;
    case 12:
      return TransitMode::monorail;
    default:
      return TransitMode::unknown;
  }
}

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

bool StaticFeed::hasRoute(std::string_view routeID) const {
  for (std::size_t i = 0; i < lineCount(); ++i)
    if (line(i).routeID == routeID) return true;
  return false;
}

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

std::uint64_t StaticFeed::checksum() const { return headerOf(*_bytes).checksum; }

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
