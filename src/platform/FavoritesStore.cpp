#include "platform/FavoritesStore.h"

#include <system_error>

#include "platform/DueAnswer.h"
#include "platform/Platform.h"

namespace nimbo {

void FavoritesStore::readContents(std::function<void(const std::optional<Favorites>&)> callback) {
  const auto answerUnread = [persister = _persister, callback, alive = std::weak_ptr(_alive)](const std::string& why) {
    if (!alive.expired())
      callback(persister->favoritesUnread(
          Error::errorWithDomain_code_reason(std::string(kFavoritesStoreErrorDomain), 0, why)));
  };
  const auto due = DueAnswer::start(
      [answerUnread] { answerUnread("The favorites could not be read within a minute. Check the disk."); });
  try {
    _queue.dispatchAsync([persister = _persister, callback, due] {
      if (due->isClaimed()) return;
      const auto favorites = persister->readFavorites();
      if (due->claim()) callback(favorites);
    });
  } catch (const std::exception& failure) {
    if (!due->claim()) return;
    const std::string why =
        std::string("The favorites could not be read: ") + failure.what() + ". Close some programs and try again.";
    Platform::current().mainRunLoop().dispatchAsync([answerUnread, why] { answerUnread(why); });
  }
}

}  // namespace nimbo
