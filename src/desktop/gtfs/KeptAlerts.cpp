#include "desktop/gtfs/KeptAlerts.h"

#include <array>
#include <charconv>

#include "desktop/gtfs/FileReading.h"
#include "desktop/gtfs/StaticFeedLayout.h"
#include "desktop/system/AtomicFile.h"

namespace nimbo {

namespace {

// Lines, then an empty one, then the body: what the file is, the address, ETag, Last-Modified, microseconds since 1970
// of the answer, the body's checksum.
constexpr std::string_view kFirstLine = "nimbo-alerts 1";
constexpr std::size_t kLines = 6;
constexpr std::uint64_t kLargestFile = 65 << 20;

template <class T>
std::optional<T> numberIn(std::string_view text) {
  T number{};
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return number;
}

}  // namespace

std::optional<KeptAlerts> KeptAlerts::read(const std::filesystem::path& path, const FeedAddress& address) {
  const auto bytes = readFile(path, kLargestFile);
  if (!bytes) return std::nullopt;
  std::string_view rest = *bytes;
  std::array<std::string_view, kLines> lines;
  for (std::string_view& line : lines) {
    const std::size_t end = rest.find('\n');
    if (end == std::string_view::npos) return std::nullopt;
    line = rest.substr(0, end);
    rest.remove_prefix(end + 1);
  }
  const auto fetchedAt = numberIn<std::int64_t>(lines[4]);
  const auto checksum = numberIn<std::uint64_t>(lines[5]);
  if (lines[0] != kFirstLine || lines[1] != address.text() || !fetchedAt || !checksum || !rest.starts_with('\n'))
    return std::nullopt;
  rest.remove_prefix(1);
  if (flatChecksum(rest) != *checksum) return std::nullopt;
  return KeptAlerts{std::string(lines[1]),
                    {std::string(lines[2]), std::string(lines[3])},
                    Date(std::chrono::microseconds(*fetchedAt)),
                    std::string(rest)};
}

ErrorRef KeptAlerts::write(const std::filesystem::path& path) const {
  std::string bytes(kFirstLine);
  for (const std::string& line :
       {address, validators.etag, validators.lastModified, std::to_string(fetchedAt.time_since_epoch().count()),
        std::to_string(flatChecksum(body))})
    bytes.append(1, '\n').append(line);
  return writeFileAtomically(path, bytes.append("\n\n").append(body));
}

}  // namespace nimbo
