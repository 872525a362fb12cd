#include "desktop/gtfs/net/FeedsPart.h"

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/system/LatePart.h"

namespace nimbo {

namespace {

FeedsPart& feedsPart() { return latePart<FeedsPart>("libnimbo-feeds.so", "nimbo_feeds"); }

ErrorRef missing(const std::string& what, const LatePartMissing& failure) {
  return transitLineServiceError(TransitLineServiceError::internal, what + ": " + failure.what() + ".");
}

}  // namespace

Outcome<HTTPAnswer> HTTPFetcher::fetch(const HTTPRequest& request, const std::stop_token& stop, const Sink& sink) try {
  return feedsPart().fetch(request, stop, sink);
} catch (const LatePartMissing& failure) {
  return missing("Cannot fetch " + request.address.publicText(), failure);
}

Outcome<std::unique_ptr<StaticFeedFiles>> openZippedFeed(const FileDescriptor& file, std::string place) try {
  return feedsPart().openZip(file, place);
} catch (const LatePartMissing& failure) {
  return missing("Cannot open " + place, failure);
}

}  // namespace nimbo
