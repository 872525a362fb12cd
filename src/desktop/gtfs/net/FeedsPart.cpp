#include "desktop/gtfs/net/FeedsPart.h"

#include "desktop/gtfs/feeds/KnownFeeds.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/system/LatePart.h"

namespace nimbo {

namespace {

FeedsPart& feedsPart() { return latePart<FeedsPart>("libnimbo-feeds.so", "nimbo_feeds"); }

ErrorRef missing(const std::string& what, const LatePartMissing& failure) {
  return transitLineServiceError(TransitLineServiceError::internal, what + ": " + failure.what() + ".");
}

/// What is to be done where a server lets nobody in and the catalog knows why; null where it does not.
ErrorRef errorOfWantedKey(const FeedAddress& address) {
  const auto known = KnownFeeds::read();
  const auto key = known ? known->keyFor(address) : std::nullopt;
  if (!key) return nullptr;
  const bool isHeader = key->place == WantedKey::Place::header;
  const std::string what = std::string(isHeader ? "header" : "parameter") + " \"" + key->name + "\"";
  return transitLineServiceError(
      TransitLineServiceError::wantedKey,
      "Cannot fetch " + address.publicText() + ": its server " +
          (address.key().isEmpty() ? "wants a key in the " : "does not take the key in the ") + what + "." +
          (key->page.empty() ? " Ask the publisher for one" : " Get one at " + key->page) +
          ", and give it with \"feed edit NAME --key\".",
      key->page.empty() ? address.publicText() : key->page);
}

}  // namespace

Outcome<HTTPAnswer> HTTPFetcher::fetch(const HTTPRequest& request, const std::stop_token& stop, const Sink& sink) try {
  auto answer = feedsPart().fetch(request, stop, sink);
  if (!answer && answer.error()->domain() == kTransitLineServiceErrorDomain &&
      answer.error()->code() == static_cast<std::int64_t>(TransitLineServiceError::keyNeeded))
    if (ErrorRef error = errorOfWantedKey(request.address)) return error;
  return answer;
} catch (const LatePartMissing& failure) {
  return missing("Cannot fetch " + request.address.publicText(), failure);
}

Outcome<std::unique_ptr<StaticFeedFiles>> openZippedFeed(const FileDescriptor& file, std::string place) try {
  return feedsPart().openZip(file, place);
} catch (const LatePartMissing& failure) {
  return missing("Cannot open " + place, failure);
}

}  // namespace nimbo
