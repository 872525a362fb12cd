#pragma once

#include <memory>

#include "platform/FavoritesStore.h"

namespace nimbo {

/// The one store of the favourites that the host application keeps, made on the first call. Any thread.
std::shared_ptr<FavoritesStore> defaultContainer();

}  // namespace nimbo
