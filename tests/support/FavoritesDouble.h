#pragma once

#include <future>
#include <mutex>

#include "platform/FavoritesStore.h"

namespace nimbo {

/// Favourites that a test sets. Any thread.
class FavoritesDouble final : public FavoritesPersisters, public FavoritesPersister {
 public:
  std::shared_ptr<FavoritesPersister> remotePersister() override { return {std::shared_ptr<void>(), this}; }
  std::optional<Favorites> readFavorites() override {
    std::unique_lock guard(_lock);
    if (auto proceed = std::move(_proceed); proceed.valid()) {
      guard.unlock();
      proceed.wait();
      guard.lock();
    }
    return _favorites;
  }
  std::optional<Favorites> favoritesUnread(const ErrorRef& reason) override {
    const std::lock_guard guard(_lock);
    _unreadReason = reason->reason();
    return _unread;
  }

  /// What the store gives for favourites that were not read, and why they were not, once they were not.
  void setUnread(std::optional<Favorites> favorites) {
    const std::lock_guard guard(_lock);
    _unread = std::move(favorites);
  }
  std::string unreadReason() const {
    const std::lock_guard guard(_lock);
    return _unreadReason;
  }

  /// Absent: they cannot be read. Empty until set.
  void setFavorites(std::optional<Favorites> favorites) {
    const std::lock_guard guard(_lock);
    _favorites = std::move(favorites);
  }
  /// The next reading takes until `proceed` is ready.
  void setFavorites(Favorites favorites, std::future<void> proceed) {
    setFavorites(std::move(favorites));
    const std::lock_guard guard(_lock);
    _proceed = std::move(proceed);
  }

 private:
  mutable std::mutex _lock;
  std::optional<Favorites> _favorites = Favorites(), _unread;
  std::string _unreadReason;
  std::future<void> _proceed;
};

}  // namespace nimbo
