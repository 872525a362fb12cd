#pragma once

#include "desktop/store/FavoritesEditor.h"

namespace nimbo {

/// Persisters over the favourites in the state database.
class SQLiteFavorites final : public FavoritesPersisters {
 public:
  /// `editor` is copied into each persister.
  explicit SQLiteFavorites(FavoritesEditor editor) : _editor(std::move(editor)) {}

  std::shared_ptr<FavoritesPersister> remotePersister() override;

 private:
  FavoritesEditor _editor;
};

}  // namespace nimbo
