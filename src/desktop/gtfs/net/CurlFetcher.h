#pragma once

#include "desktop/gtfs/net/HTTPFetcher.h"

namespace nimbo {

/// `HTTPFetcher::fetch`, by libcurl.
Outcome<HTTPAnswer> fetchWithCurl(const HTTPRequest& request, const std::stop_token& stop,
                                  const HTTPFetcher::Sink& sink);

}  // namespace nimbo
