#pragma once

#include <memory>
#include <string>

#include "platform/foundation/Boxed.h"
#include "platform/foundation/URL.h"

namespace nimbo {

/// Map types of the map application's URLs and display options.
inline constexpr int kMapTypeTransit = 3;

/// Builds URLs that the map application understands.
class MapURLBuilder {
 public:
  /// A URL that shows the user's favourites. `type` 2 is the favourite transit lines.
  static MapURLBuilder initForShowFavoritesType(int type, int mapType) { return {type, mapType}; }

  /// "nimbo://?favorites=TYPE", with "t=r" for the transit map.
  URL build() const;

 private:
  MapURLBuilder(int favoritesType, int mapType) : _favoritesType(favoritesType), _mapType(mapType) {}
  int _favoritesType;
  int _mapType;
};

/// Settings key of the session identifier that widget and map application share.
inline constexpr std::string_view kUserSessionIdentifierKey = "Nimbo.UserSession.identifier";

/// User-info key and URL parameter that carry the session identifier.
inline constexpr std::string_view kUserSessionTag = "session";

/// Tags what is handed to the map application with the session that both share, so that it can tell that a hand-off
/// comes from the user's own widget. The identifier is random, says nothing of the user and never leaves the machine.
/// Main thread only.
class UserSession {
 public:
  /// Makes a session identifier and, when `shareWithHost`, stores it in the shared settings, unless there is one
  /// already; `reset` makes a new one in any case.
  static void prepareSharedSession(bool shareWithHost = true, bool reset = false);

  /// `userInfo` with the session's tag added; unchanged while no session is prepared.
  static std::shared_ptr<const BoxedDictionary> sharedSessionUserInfoForPunchoutUserInfo(
      const std::shared_ptr<const BoxedDictionary>& userInfo);

  /// The URL with the session's tag as a query parameter; unchanged while no session is prepared.
  static URL sharedSessionURLForPunchoutURL(const std::string& absoluteString);
};

}  // namespace nimbo
