#pragma once

#include <memory>

#include "platform/artwork/ArtworkCache.h"

namespace nimbo {

/// A new cache for a process with little memory: the platform's shield renderer, if there is one, keeps no whole sheets
/// of icons from now on.
std::shared_ptr<ArtworkCache> memoryConstrainedImageViewCache();

}  // namespace nimbo
