#include "desktop/store/SQLiteFavorites.h"

#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

class Persister final : public FavoritesPersister {
 public:
  explicit Persister(FavoritesEditor editor) : _editor(std::move(editor)) {}

  std::optional<Favorites> readFavorites() override {
    Favorites favorites;
    const ErrorRef error = _editor.list(favorites);
    if (!error) return favorites;
    writeLog({kDefaultLogSubsystem, "Favorites"}, LogLevel::error, "Unable to read the favorites: %@",
             {error->reason()});
    return std::nullopt;
  }

 private:
  FavoritesEditor _editor;
};

}  // namespace

std::shared_ptr<FavoritesPersister> SQLiteFavorites::remotePersister() { return std::make_shared<Persister>(_editor); }

}  // namespace nimbo
