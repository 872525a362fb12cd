// libnimbo-feeds.so: what FeedsPart.h declares.

#include "desktop/gtfs/net/CurlFetcher.h"
#include "desktop/gtfs/net/FeedsPart.h"
#include "desktop/gtfs/static/ZipFeedFiles.h"

namespace nimbo {

namespace {

class CurlAndZip final : public FeedsPart {
  Outcome<HTTPAnswer> fetch(const HTTPRequest& request, const std::stop_token& stop,
                            const HTTPFetcher::Sink& sink) override {
    return fetchWithCurl(request, stop, sink);
  }
  Outcome<std::unique_ptr<StaticFeedFiles>> openZip(const FileDescriptor& file, std::string place) override {
    return ZipFeedFiles::open(file, std::move(place));
  }
};

}  // namespace

}  // namespace nimbo

extern "C" nimbo::FeedsPart* nimbo_feeds() {
  static nimbo::CurlAndZip part;
  return &part;
}
