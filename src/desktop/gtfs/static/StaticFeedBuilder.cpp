#include "desktop/gtfs/static/StaticFeedBuilder.h"

#include <charconv>
#include <stdexcept>

#include "desktop/gtfs/feeds/FeedMuid.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/CsvTable.h"
#include "desktop/gtfs/text/Identifier.h"
#include "desktop/gtfs/text/Utf8.h"

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

bool StaticFeedBuilder::addAgency(std::string_view publishedID, std::string_view name) {
  const Identifier id(publishedID);
  const auto index = static_cast<std::uint32_t>(_agencies.size());
  if (!_agencyByID.emplace(id.text(), index).second) return false;
  _agencies.push_back({add(id.text()), add(name), static_cast<std::int64_t>(TransitMode::unknown)});
  return true;
}

bool StaticFeedBuilder::addLine(std::string_view publishedAgencyID, const StaticLine& line) {
  const Identifier routeID(line.routeID), agencyID(publishedAgencyID);
  if (!_lineByRoute.emplace(routeID.text(), static_cast<std::uint32_t>(_lines.size())).second) return false;
  std::uint32_t agency = 0;
  if (!agencyID.text().empty() || _agencies.size() != 1) {
    addAgency(agencyID.text(), {});
    agency = _agencyByID.at(std::string(agencyID.text()));
  }
  // The number is that of the identifier as it was ever since: favorites hold it.
  _lines.push_back({lineMuid(_feed, line.routeID), add(routeID.text()), add(line.shortName), add(line.longName),
                    line.color.value_or(kNoColor), line.textColor.value_or(kNoColor), line.type, agency});
  return true;
}

std::optional<std::uint32_t> StaticFeedBuilder::lineOfRoute(std::string_view routeID) const {
  const auto found = _lineByRoute.find(std::string(Identifier(routeID).text()));
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

namespace {

constexpr std::uint64_t kLargestTable = 64 << 20;
constexpr std::uint64_t kLargestTripsTable = 512 << 20;
constexpr std::size_t kMostTrips = 5'000'000;
constexpr std::size_t kMostLines = 200'000;  // and agencies; a continent has fewer, and each costs memory

using Values = std::span<const std::string_view>;

ErrorRef badFeed(const StaticFeedFiles& files, const std::string& what) {
  return transitLineServiceError(TransitLineServiceError::badStaticFeed,
                                 "The static feed " + std::string(files.place()) + " cannot be used: " + what,
                                 std::string(files.place()));
}

ErrorRef moreThanFit(const StaticFeedFiles& files, const std::string& what) {
  return transitLineServiceError(TransitLineServiceError::tooLarge,
                                 "The static feed " + std::string(files.place()) + " has more than " +
                                     std::to_string(kMostLines) + " " + what + ". Check that it is the right one.",
                                 std::string(files.place()));
}

/// Reads a table of the feed. False when the feed has none.
Outcome<bool> readTable(StaticFeedFiles& files, std::string_view name, std::uint64_t limit, CsvTable& table) {
  bool readable = true;
  auto found = files.read(name, limit, [&](std::string_view piece) { return readable = table.read(piece); });
  if (!found || !*found) return found;
  if (!readable || !table.finish())
    return badFeed(files, "a value in its " + std::string(name) +
                              " is longer than 1 MiB; a quotation mark may be missing there. Fetch it anew.");
  return true;
}

/// "FF0000", also with a "#"; absent for anything else.
std::optional<std::uint32_t> colorFrom(std::string_view text) {
  if (text.starts_with('#')) text.remove_prefix(1);
  std::uint32_t color = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), color, 16);
  if (text.size() != 6 || error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return color;
}

RouteType routeTypeFrom(std::string_view text, std::string_view routeID, SkipReport& skipped) {
  RouteType type = kUnknownRouteType;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), type);
  if (!text.empty() && error == std::errc() && end == text.data() + text.size() && type >= 0) return type;
  skipped.add("route_type that is no number; the line is kept", routeID);
  return kUnknownRouteType;
}

ErrorRef readAgencies(StaticFeedFiles& files, ParsedStaticFeed& parsed, std::string& language) {
  CsvTable table({"agency_id", "agency_name", "agency_lang"}, [&](Values row) {
    if (parsed.feed.agencyCount() > kMostLines) return;
    if (row[0].empty() && row[1].empty())
      parsed.skipped.add("agency without agency_id and agency_name", {});
    else if (!parsed.feed.addAgency(row[0], row[1]))
      parsed.skipped.add("agency_id that occurs twice", row[0]);
    else if (language.empty())
      language = row[2];
  });
  const ErrorRef error = readTable(files, "agency.txt", kLargestTable, table).error();
  return !error && parsed.feed.agencyCount() > kMostLines ? moreThanFit(files, "agencies") : error;
}

ErrorRef readFeedInfo(StaticFeedFiles& files, std::string& language) {
  CsvTable table({"feed_lang"}, [&](Values row) {
    if (!row[0].empty() && asciiLowerCase(row[0]) != "mul") language = row[0];  // "mul": several languages
  });
  return readTable(files, "feed_info.txt", kLargestTable, table).error();
}

ErrorRef readRoutes(StaticFeedFiles& files, ParsedStaticFeed& parsed) {
  CsvTable table(
      {"route_id", "agency_id", "route_short_name", "route_long_name", "route_type", "route_color", "route_text_color"},
      [&](Values row) {
        if (parsed.feed.lineCount() > kMostLines) return;
        if (row[0].empty()) {
          parsed.skipped.add("route without route_id", row[3]);
          return;
        }
        StaticLine line;
        line.routeID = row[0];
        line.shortName = row[2];
        line.longName = row[3];
        line.type = routeTypeFrom(row[4], row[0], parsed.skipped);
        line.color = colorFrom(row[5]);
        line.textColor = colorFrom(row[6]);
        if (!parsed.feed.addLine(row[1], line)) parsed.skipped.add("route_id that occurs twice", row[0]);
      });
  const auto found = readTable(files, "routes.txt", kLargestTable, table);
  if (!found) return found.error();
  if (!*found)
    return badFeed(files, "it has no routes.txt. Give a folder or a zip file with agency.txt and routes.txt.");
  if (!table.hasColumn(0)) return badFeed(files, "its routes.txt has no column route_id. Fetch it anew.");
  if (parsed.feed.lineCount() > kMostLines) return moreThanFit(files, "lines");
  if (parsed.feed.lineCount() == 0) return badFeed(files, "its routes.txt has no usable line. Fetch it anew.");
  return nullptr;
}

/// Trips only help with selectors that name nothing else: a table that cannot be read makes no bad feed.
void readTrips(StaticFeedFiles& files, ParsedStaticFeed& parsed) {
  bool tooMany = false;
  CsvTable table({"trip_id", "route_id"}, [&](Values row) {
    const auto line = parsed.feed.lineOfRoute(row[1]);
    tooMany = tooMany || parsed.trips.count() >= kMostTrips;
    if (row[0].empty() || !line)
      parsed.skipped.add("trip without trip_id or of an unknown route", row[0]);
    else if (!tooMany)
      parsed.trips.add(Identifier(row[0]).text(), *line);
  });
  const auto found = readTable(files, "trips.txt", kLargestTripsTable, table);
  const bool isTable = found && *found && table.hasColumn(0) && table.hasColumn(1);
  if (found && !*found)
    parsed.trips.giveUp();
  else if (!isTable || tooMany) {
    parsed.skipped.add("trips.txt as a whole, since it is too large or cannot be read", {});
    parsed.trips.giveUp();
  }
  parsed.trips.finish();
}

}  // namespace

Outcome<ParsedStaticFeed> readStaticFeed(StaticFeedFiles& files, const std::string& feedName) {
  ParsedStaticFeed parsed{StaticFeedBuilder(feedName), {}, {}};
  std::string language;
  if (const ErrorRef error = readAgencies(files, parsed, language)) return error;
  if (const ErrorRef error = readFeedInfo(files, language)) return error;
  parsed.feed.setLanguage(language);
  if (const ErrorRef error = readRoutes(files, parsed)) return error;
  readTrips(files, parsed);
  return parsed;
}

}  // namespace nimbo
