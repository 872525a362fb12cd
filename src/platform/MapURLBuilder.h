#pragma once

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

}  // namespace nimbo
