#pragma once

#include <mutex>

#include "platform/FavoritesStore.h"

namespace nimbo {

/// Favourites that a test sets. Any thread.
class FavoritesDouble final : public FavoritesPersisters {
 public:
  std::shared_ptr<FavoritesPersister> remotePersister() override { return std::make_shared<Persister>(*this); }

  /// Absent: they cannot be read. Empty until set.
  void setFavorites(std::optional<Favorites> favorites) {
    const std::lock_guard guard(_lock);
    _favorites = std::move(favorites);
  }

 private:
  class Persister final : public FavoritesPersister {
   public:
    explicit Persister(FavoritesDouble& owner) : _owner(owner) {}
    std::optional<Favorites> readFavorites() override {
      const std::lock_guard guard(_owner._lock);
      return _owner._favorites;
    }

   private:
    FavoritesDouble& _owner;
  };

  std::mutex _lock;
  std::optional<Favorites> _favorites = Favorites();
};

}  // namespace nimbo
