#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/SerialQueue.h"
#include "platform/foundation/Error.h"
#include "platform/foundation/Object.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// Something that the user keeps in the map application. Kinds that this program knows nothing of stand among them.
class Favorite : public Object {
 public:
  /// Kind as stored: "transit-line", or a kind of another application ("place", ...).
  virtual const std::string& kind() const = 0;
};

using FavoriteRef = std::shared_ptr<const Favorite>;

/// Kind of a favourite transit line.
inline constexpr std::string_view kFavoriteKindTransitLine = "transit-line";

class FavoriteTransitLine final : public Favorite {
 public:
  /// `transitLine` may be null: a favourite whose line could not be read.
  explicit FavoriteTransitLine(TransitLineRef transitLine) : _transitLine(std::move(transitLine)) {}

  /// The line as it was when the user kept it, or null.
  const TransitLineRef& transitLine() const { return _transitLine; }

  const std::string& kind() const override { return _kind; }
  std::string_view className() const override { return "FavoriteTransitLine"; }

 private:
  std::string _kind{kFavoriteKindTransitLine};
  TransitLineRef _transitLine;
};

/// A favourite of any other kind, kept for its owner.
class OtherFavorite final : public Favorite {
 public:
  explicit OtherFavorite(std::string kind) : _kind(std::move(kind)) {}
  const std::string& kind() const override { return _kind; }
  std::string_view className() const override { return "OtherFavorite"; }

 private:
  std::string _kind;
};

/// The favourites in the user's order.
using Favorites = std::vector<FavoriteRef>;

/// Domain of the errors of favourites that were not read at all.
inline constexpr std::string_view kFavoritesStoreErrorDomain = "org.nimbo.FavoritesStore";

/// Reads the favourites from where they are kept.
class FavoritesPersister {
 public:
  virtual ~FavoritesPersister() = default;
  /// Absent when they cannot be read (which is logged). Called on one thread at a time, not the main thread.
  virtual std::optional<Favorites> readFavorites() = 0;
  /// What stands for favourites that were not read, for the reason given; absent where nothing does. Any thread.
  virtual std::optional<Favorites> favoritesUnread(const ErrorRef& reason) = 0;
};

/// The user's favourites, read on a thread of the store's own.
class FavoritesStore final {
 public:
  explicit FavoritesStore(std::shared_ptr<FavoritesPersister> persister)
      : _persister(std::move(persister)), _queue("org.nimbo.FavoritesStore") {}

  /// Calls `callback` once with the favourites, absent when they cannot be read, on the store's own thread; not at all
  /// when the store goes away first. When that thread cannot start, or has not read them after `DueAnswer::kPatience`,
  /// the callback comes on the main thread with what the persister has for favourites that were not read. Any thread.
  void readContents(std::function<void(const std::optional<Favorites>&)> callback);

 private:
  std::shared_ptr<FavoritesPersister> _persister;
  std::shared_ptr<bool> _alive = std::make_shared<bool>(true);  // let go of on the main thread
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
