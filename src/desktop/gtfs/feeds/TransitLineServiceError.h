#pragma once

#include <string>
#include <string_view>

#include "platform/foundation/Error.h"
#include "platform/foundation/Log.h"

namespace nimbo {

/// Where the line service and its feeds log.
inline constexpr LogFacility kFeedLogFacility{kDefaultLogSubsystem, "TransitLineService"};

/// Domain of the errors of the line service, its feeds and their configuration.
inline constexpr std::string_view kTransitLineServiceErrorDomain = "TransitLineServiceErrorDomain";

/// Codes of that domain. Every error also carries a reason: what went wrong, where, and what to do.
enum class TransitLineServiceError : std::int64_t {
  configuration = 1,        ///< feeds.json cannot be used
  badFeedName = 2,          ///< a feed cannot have this name
  unknownFeed = 3,          ///< no feed of this name is set up
  badAddress = 4,           ///< neither a path nor an http or https address
  unreadableFile = 5,       ///< a file or folder is missing or cannot be read
  badStaticFeed = 6,        ///< not a GTFS static feed
  badAlerts = 7,            ///< not a GTFS-Realtime alerts feed
  staleAlerts = 8,          ///< the publisher has not renewed the alerts for too long
  unreachable = 9,          ///< no connection to the server, or it broke
  timedOut = 10,            ///< the server took too long
  serverFailure = 11,       ///< the server answered with an error
  untrustedServer = 12,     ///< the server's certificate does not verify
  tooLarge = 13,            ///< more bytes than any feed has
  unknownLine = 14,         ///< a feed has no such line, or none of those asked for
  internal = 15,            ///< a failure of the program itself
  feedNameTaken = 16,       ///< another feed has this name
  keyNeeded = 17,           ///< the server lets nobody in without a key
  notKept = 18,             ///< no room for what the server sends
  otherFeed = 19,           ///< a GTFS-Realtime feed that holds no alerts but something else
  foreignAlerts = 20,       ///< the alerts name routes of another static feed
  downloading = 21,         ///< a static feed that has never been here is still coming
  notAsked = 22,            ///< the line has not been looked up yet
  notFound = 23,            ///< the server has nothing at the address
  cutOff = 24,              ///< not all of an answer has come
  tripsMissing = 25,        ///< the trips that an alert is about cannot be had
  badCatalog = 26,          ///< the catalog of feeds cannot be used
  unknownCatalogFeed = 27,  ///< the catalog has no feed of this identifier
  wantedKey = 28,           ///< the server wants a key that the catalog knows of; the subject says where to get one
  badKey = 29,              ///< a key or header that cannot be sent, or that nobody wants
  staticForAlerts = 30,     ///< a static feed where alerts should be
  alertsForStatic = 31,     ///< alerts where a static feed should be
  webPage = 32,             ///< a page for people, or another text, where a feed should be
};

/// An error of `kTransitLineServiceErrorDomain`. The subject is the feed's name, or its place without secrets.
inline ErrorRef transitLineServiceError(TransitLineServiceError code, std::string reason, std::string subject = {}) {
  return Error::errorWithDomain_code_reason(std::string(kTransitLineServiceErrorDomain),
                                            static_cast<std::int64_t>(code), std::move(reason), std::move(subject));
}

}  // namespace nimbo
