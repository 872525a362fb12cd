#pragma once

#include <mutex>

#include "platform/FavoritesStore.h"

namespace nimbo {

/// Favourites that a test sets. Any thread.
class FavoritesDouble final : public FavoritesPersisters, public FavoritesPersister {
 public:
  std::shared_ptr<FavoritesPersister> remotePersister() override { return {std::shared_ptr<void>(), this}; }
  std::optional<Favorites> readFavorites() override {
    const std::lock_guard guard(_lock);
    return _favorites;
  }

  /// Absent: they cannot be read. Empty until set.
  void setFavorites(std::optional<Favorites> favorites) {
    const std::lock_guard guard(_lock);
    _favorites = std::move(favorites);
  }

 private:
  std::mutex _lock;
  std::optional<Favorites> _favorites = Favorites();
};

}  // namespace nimbo
