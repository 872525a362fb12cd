#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <vector>

#include "platform/Favorite.h"
#include "platform/SerialQueue.h"

namespace nimbo {

/// The favourites in the user's order.
using Favorites = std::vector<FavoriteRef>;

/// Reads the favourites from where they are kept.
class FavoritesPersister {
 public:
  virtual ~FavoritesPersister() = default;
  /// Absent when they cannot be read (which is logged). Called on one thread at a time, not the main thread.
  virtual std::optional<Favorites> readFavorites() = 0;
};

/// The user's favourites, read on a thread of the store's own.
class FavoritesStore final {
 public:
  explicit FavoritesStore(std::shared_ptr<FavoritesPersister> persister)
      : _persister(std::move(persister)), _queue("org.nimbo.FavoritesStore") {}

  /// Calls `callback` once with the favourites, absent when they cannot be read, on the store's own thread; not at all
  /// when the store goes away first. Any thread.
  void readContents(std::function<void(const std::optional<Favorites>&)> callback);

 private:
  std::shared_ptr<FavoritesPersister> _persister;
  SerialQueue _queue;
};

/// Makes persisters.
class FavoritesPersisters {
 public:
  virtual ~FavoritesPersisters() = default;
  /// A persister that reads the favourites which the host application keeps. Never null.
  virtual std::shared_ptr<FavoritesPersister> remotePersister() = 0;
};

}  // namespace nimbo
