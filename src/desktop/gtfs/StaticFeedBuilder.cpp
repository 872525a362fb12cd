#include "desktop/gtfs/StaticFeedBuilder.h"

#include <stdexcept>

#include "desktop/gtfs/FeedMuid.h"
#include "desktop/gtfs/Utf8.h"

namespace nimbo {

namespace {

FlatText appendText(std::string& texts, std::string_view text) {
  if (texts.size() + text.size() > UINT32_MAX) throw std::length_error("the texts of a feed exceed 4 GiB");
  const FlatText place{static_cast<std::uint32_t>(texts.size()), static_cast<std::uint32_t>(text.size())};
  texts.append(text);
  return place;
}

template <class T>
void appendRecord(std::string& bytes, const T& record) {
  bytes.append(reinterpret_cast<const char*>(&record), sizeof record);
}

}  // namespace

FlatText StaticFeedBuilder::add(std::string_view text) { return appendText(_texts, validUtf8(text)); }

bool StaticFeedBuilder::addAgency(std::string_view id, std::string_view name) {
  const auto index = static_cast<std::uint32_t>(_agencies.size());
  if (!_agencyByID.emplace(id, index).second) return false;
  _agencies.push_back({add(id), add(name), static_cast<std::int64_t>(TransitMode::unknown)});
  return true;
}

bool StaticFeedBuilder::addLine(std::string_view agencyID, const StaticLine& line) {
  if (!_lineByRoute.emplace(line.routeID, static_cast<std::uint32_t>(_lines.size())).second) return false;
  std::uint32_t agency = 0;
  if (!agencyID.empty() || _agencies.size() != 1) {
    addAgency(agencyID, {});
    agency = _agencyByID.at(std::string(agencyID));
  }
  _lines.push_back({lineMuid(_feed, line.routeID), add(line.routeID), add(line.shortName), add(line.longName),
                    line.color.value_or(kNoColor), line.textColor.value_or(kNoColor), line.type, agency});
  return true;
}

std::optional<std::uint32_t> StaticFeedBuilder::lineOfRoute(std::string_view routeID) const {
  const auto found = _lineByRoute.find(std::string(routeID));
  if (found == _lineByRoute.end()) return std::nullopt;
  return found->second;
}

StaticFeed StaticFeedBuilder::finish(std::string_view fingerprint, Date checkedAt) const {
  std::vector<FlatAgency> agencies = _agencies;
  std::vector<bool> isMixed(agencies.size());
  for (const FlatLine& line : _lines) {
    const auto mode = static_cast<std::int64_t>(modeOfRouteType(line.type));
    std::int64_t& shared = agencies[line.agency].sharedMode;
    if (isMixed[line.agency]) continue;
    if (mode == 0 || (shared != 0 && shared != mode)) {
      isMixed[line.agency] = true;
      shared = 0;
    } else {
      shared = mode;
    }
  }
  std::string texts = _texts;
  FlatHeader header;
  header.magic = kFlatFeedMagic;
  header.checkedAt = checkedAt.time_since_epoch().count();
  header.agencyCount = static_cast<std::uint32_t>(agencies.size());
  header.lineCount = static_cast<std::uint32_t>(_lines.size());
  header.language = appendText(texts, _language);
  header.fingerprint = appendText(texts, fingerprint);
  std::string bytes;
  bytes.reserve(sizeof header + agencies.size() * sizeof(FlatAgency) + _lines.size() * sizeof(FlatLine) + texts.size());
  appendRecord(bytes, header);
  for (const FlatAgency& agency : agencies) appendRecord(bytes, agency);
  for (const FlatLine& line : _lines) appendRecord(bytes, line);
  bytes += texts;
  header.checksum = flatChecksum(std::string_view(bytes).substr(kFlatChecksumEnd));
  std::memcpy(bytes.data(), &header, sizeof header);
  return StaticFeed(std::move(bytes));
}

}  // namespace nimbo
