#include "incidents/FavoritesStore+Nimbo.h"
#include "platform/Platform.h"

namespace nimbo {

std::shared_ptr<FavoritesStore> defaultContainer() {
  Platform& platform = Platform::current();
  return platform.singleton<FavoritesStore>(
      [&] { return std::make_shared<FavoritesStore>(platform.favorites().remotePersister()); });
}

}  // namespace nimbo
