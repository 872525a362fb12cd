#pragma once

#include "desktop/gtfs/net/HTTPFetcher.h"
#include "desktop/gtfs/static/StaticFeedFiles.h"
#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

/// What libnimbo-feeds does, the part with libcurl and libzip (system/LatePart.h). Any thread.
class FeedsPart {
 public:
  virtual ~FeedsPart() = default;
  /// `HTTPFetcher::fetch`.
  virtual Outcome<HTTPAnswer> fetch(const HTTPRequest& request, const std::stop_token& stop,
                                    const HTTPFetcher::Sink& sink) = 0;
  /// `openZippedFeed`.
  virtual Outcome<std::unique_ptr<StaticFeedFiles>> openZip(const FileDescriptor& file, std::string place) = 0;
};

/// A static feed as a zip archive, in a file opened for reading. `place` names it in messages. Any thread.
Outcome<std::unique_ptr<StaticFeedFiles>> openZippedFeed(const FileDescriptor& file, std::string place);

}  // namespace nimbo
