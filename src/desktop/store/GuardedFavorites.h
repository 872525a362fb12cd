#pragma once

#include <memory>
#include <mutex>

#include "desktop/store/FavoritesEditor.h"
#include "platform/FavoritesStore.h"
#include "platform/TransitLineService.h"

namespace nimbo {

/// Favourites that cannot be read must not look like none: the widget would say that the user has no favourite lines.
/// While they cannot be read, the persisters give one line that stands for all of them, and the lookup of that line
/// fails with the reason.
class GuardedFavorites final : public FavoritesPersisters, public TransitLineService {
 public:
  /// `service` answers for real lines and outlives this.
  GuardedFavorites(FavoritesEditor editor, TransitLineService& service);

  std::shared_ptr<FavoritesPersister> remotePersister() override;
  void lookup(const std::vector<MapItemIdentifierRef>& identifiers, Handler handler) override;

 private:
  /// Shared with the persisters, which live as long as the platform's favourites store.
  struct State {
    explicit State(FavoritesEditor favoritesEditor) : editor(std::move(favoritesEditor)) {}
    FavoritesEditor editor;
    std::mutex lock;
    ErrorRef failure;  // of the last reading
  };
  class Persister;

  std::shared_ptr<State> _state;
  TransitLineService& _service;
};

}  // namespace nimbo
