#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <stop_token>
#include <string>
#include <string_view>

#include "desktop/gtfs/feeds/Feed.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// How a server tells one state of a document from another; empty where it does not. Source: RFC 9110, section 8.8.
struct HTTPValidators {
  std::string etag;
  std::string lastModified;
  bool operator==(const HTTPValidators&) const = default;
};

/// What a server says of the moment at which it wants to be asked again, as it says it; empty where it does not.
struct HTTPWishes {
  std::string cacheControl;
  std::string age;
  std::string retryAfter;
};

/// A document to fetch.
struct HTTPRequest {
  FeedAddress address;             ///< a remote one
  HTTPValidators validators;       ///< of the state that is held already: ask only for another one
  std::uint64_t limit;             ///< bytes, unpacked
  std::chrono::seconds timeLimit;  ///< for everything, redirects too
  HTTPWishes* wishes = nullptr;    ///< set by whatever answer came last, also one that is an error; null: not needed
  /// Hears how long the document is before its first piece comes, where the server says so.
  std::function<void(std::uint64_t bytes)> onLength = {};
};

/// What a server answered.
struct HTTPAnswer {
  bool isUnchanged = false;  ///< the state that is held is still the present one
  HTTPValidators validators;
};

/// Fetches documents by HTTP and HTTPS, blocking its thread: conditional requests, gzip, a few redirects that stay with
/// these two schemes, the system's proxy and certificates. Each call is on its own; any thread.
class HTTPFetcher {
 public:
  /// Takes a piece of the document; false when it cannot be kept, which ends the fetch.
  using Sink = std::function<bool(std::string_view piece)>;

  /// Fetches; the document's pieces go to `sink`. Errors name the address without its secrets, what went wrong and what
  /// to do; pieces given before an error are worth nothing. A server that sends next to nothing for 30 seconds is given
  /// up. Ends soon after `stop` is requested.
  static Outcome<HTTPAnswer> fetch(const HTTPRequest& request, const std::stop_token& stop, const Sink& sink);
};

}  // namespace nimbo
