#include "desktop/gtfs/static/TripRoutes.h"

#include <algorithm>

#include "desktop/gtfs/static/StaticFeed.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

constexpr std::uint64_t kMagic = 0x00025350495254;  // version 2

struct Header {
  std::uint64_t magic, key, count, isWhole, checksum;
};

bool isEarlier(const TripRoutes::Entry& a, const TripRoutes::Entry& b) { return a.trip < b.trip; }

std::string_view bytesOf(const std::vector<TripRoutes::Entry>& entries) {
  return {reinterpret_cast<const char*>(entries.data()), entries.size() * sizeof(TripRoutes::Entry)};
}

}  // namespace

void TripRoutes::add(std::string_view tripID, std::uint32_t line) { _entries.push_back({hashOfBytes(tripID), line}); }

void TripRoutes::giveUp() {
  _entries = {};
  _isWhole = false;
}

void TripRoutes::finish() { std::stable_sort(_entries.begin(), _entries.end(), isEarlier); }

std::optional<std::uint32_t> TripRoutes::lineOfTrip(std::string_view tripID) const {
  const Entry wanted{hashOfBytes(tripID), 0};
  const auto found = std::lower_bound(_entries.begin(), _entries.end(), wanted, isEarlier);
  if (found == _entries.end() || found->trip != wanted.trip) return std::nullopt;
  return static_cast<std::uint32_t>(found->line);
}

std::string TripRoutes::bytes(std::uint64_t key) const {
  const std::string_view entries = bytesOf(_entries);
  const Header header{kMagic, key, _entries.size(), _isWhole ? 1u : 0u, flatChecksum(entries)};
  std::string bytes(reinterpret_cast<const char*>(&header), sizeof header);
  bytes.append(entries);
  return bytes;
}

std::optional<TripRoutes> TripRoutes::fromBytes(std::string_view bytes, std::uint64_t key, std::size_t lineCount) {
  if (bytes.size() < sizeof(Header)) return std::nullopt;
  const auto header = flatRecordAt<Header>(bytes, 0);
  const std::string_view content = bytes.substr(sizeof(Header));
  if (header.magic != kMagic || header.key != key || content.size() % sizeof(Entry) != 0 ||
      header.count != content.size() / sizeof(Entry) || header.checksum != flatChecksum(content))
    return std::nullopt;
  TripRoutes routes;
  routes._isWhole = header.isWhole == 1;
  routes._entries.resize(header.count);
  if (!content.empty()) std::memcpy(routes._entries.data(), content.data(), content.size());
  const bool sound = std::all_of(routes._entries.begin(), routes._entries.end(),
                                 [&](const Entry& entry) { return entry.line < lineCount; });
  if (!sound) return std::nullopt;
  return routes;
}

}  // namespace nimbo
