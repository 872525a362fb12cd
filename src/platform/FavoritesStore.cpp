#include "platform/FavoritesStore.h"

namespace nimbo {

void FavoritesStore::readContents(std::function<void(const std::optional<Favorites>&)> callback) {
  _queue.dispatchAsync(
      [persister = _persister, callback = std::move(callback)] { callback(persister->readFavorites()); });
}

}  // namespace nimbo
