#include "desktop/store/GuardedFavorites.h"

#include "platform/Platform.h"
#include "platform/transit/BasicTransitLineItem.h"

namespace nimbo {

namespace {

/// Number of the line that stands for favourites that cannot be read. Lines' numbers are hashes; 0 is none of them.
constexpr std::uint64_t kUnreadableMuid = 0;

}  // namespace

class GuardedFavorites::Persister final : public FavoritesPersister {
 public:
  explicit Persister(std::shared_ptr<State> state) : _state(std::move(state)) {}

  std::optional<Favorites> readFavorites() override {
    auto favorites = _state->editor.list();
    {
      const std::lock_guard guard(_state->lock);
      _state->failure = favorites.error();
    }
    if (favorites) return std::move(*favorites);
    return standIn();
  }

  std::optional<Favorites> favoritesUnread(const ErrorRef& reason) override {
    const std::lock_guard guard(_state->lock);
    _state->failure = reason;
    return standIn();
  }

 private:
  static Favorites standIn() {
    const auto line = std::make_shared<const BasicTransitLineItem>(
        BasicTransitLineItem::Fields{.identifier = std::make_shared<const MapItemIdentifier>(kUnreadableMuid)});
    return Favorites{std::make_shared<const FavoriteTransitLine>(line)};
  }

  std::shared_ptr<State> _state;
};

GuardedFavorites::GuardedFavorites(FavoritesEditor editor, TransitLineService& service)
    : _state(std::make_shared<State>(std::move(editor))), _service(service) {}

std::shared_ptr<FavoritesPersister> GuardedFavorites::remotePersister() { return std::make_shared<Persister>(_state); }

void GuardedFavorites::lookup(const std::vector<MapItemIdentifierRef>& identifiers, Handler handler) {
  const bool unreadable = identifiers.size() == 1 && identifiers.front()->muid() == kUnreadableMuid;
  if (!unreadable) return _service.lookup(identifiers, std::move(handler));
  ErrorRef failure;
  {
    const std::lock_guard guard(_state->lock);
    failure = _state->failure;
  }
  // They have been read since; the fetch that could not wait for that has failed all the same.
  if (!failure)
    failure = Error::errorWithDomain_code_reason(std::string(kFavoritesStoreErrorDomain), 0,
                                                 "The favorites were read too late. Try again.");
  Platform::current().mainRunLoop().dispatchAsync([failure, handler = std::move(handler)] { handler({}, failure); });
}

}  // namespace nimbo
