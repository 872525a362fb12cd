// A publisher's static feed: its tables in memory, one after another with zero bytes between, or a zip archive.

#include <sys/mman.h>
#include <unistd.h>

#include "Fuzz.h"
#include "desktop/gtfs/net/FeedsPart.h"
#include "desktop/gtfs/static/StaticFeedBuilder.h"

namespace nimbo {

namespace {

class Tables final : public StaticFeedFiles {
 public:
  Tables(std::string_view text, std::size_t piece) : _text(text), _piece(piece) {}
  Outcome<bool> read(std::string_view name, std::uint64_t, const Sink& sink) override {
    std::string_view rest = _text;
    for (const std::string_view table : {"routes.txt", "agency.txt", "feed_info.txt", "trips.txt"}) {
      std::string_view content = rest.substr(0, rest.find('\0'));
      rest.remove_prefix(std::min(content.size() + 1, rest.size()));
      if (table != name) continue;
      for (; !content.empty(); content.remove_prefix(std::min(_piece, content.size())))
        if (!sink(content.substr(0, _piece))) return true;
      return true;
    }
    return false;
  }
  std::string_view place() const override { return "fuzz"; }

 private:
  std::string_view _text;
  std::size_t _piece;
};

std::string bytesOf(StaticFeedFiles& files) {
  const auto parsed = readStaticFeed(files, "fuzz");
  if (!parsed) return parsed.error()->reason();
  const StaticFeed feed = parsed->feed.finish("print", {});
  const auto kept = StaticFeed::fromBytes(std::string(feed.bytes()));
  require(kept.has_value(), "a feed can be kept");
  for (std::size_t i = 0; i < kept->lineCount(); ++i) {
    const StaticLine line = kept->line(i);
    for (const std::string_view text : {line.routeID, line.shortName, line.longName, kept->agency(line.agency).name})
      require(validUtf8(text) == text, "a feed's texts are UTF-8");
    require(line.color.value_or(0) <= 0xFFFFFF && line.type >= -1, "a line's numbers are in their range");
  }
  const std::string trips = parsed->trips.bytes(1);
  require(TripRoutes::fromBytes(trips, 1, kept->lineCount()).has_value(), "the trips can be kept");
  return std::string(feed.bytes()) + trips;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string_view text = textOf(data, size);
  if (text.starts_with("PK")) {
    const FileDescriptor file(::memfd_create("feed.zip", MFD_CLOEXEC));
    require(::write(file.get(), data, size) == static_cast<ssize_t>(size), "there is memory");
    if (const auto zip = openZippedFeed(file, "fuzz")) bytesOf(**zip);
    return 0;
  }
  Tables whole(text, size + 1), pieces(text, 3);
  require(bytesOf(whole) == bytesOf(pieces), "the pieces in which a table comes do not matter");
  return 0;
}

}  // namespace nimbo
