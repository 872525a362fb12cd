#include "platform/Platform.h"
#include "ui/ArtworkCache+Nimbo.h"

namespace nimbo {

std::shared_ptr<ArtworkCache> memoryConstrainedImageViewCache() {
  const auto& renderer = Platform::current().shieldRenderer();
  if (renderer) renderer->setCachesIconAtlases(false);
  return ArtworkCache::initWithArtworkManager(TransitArtworkManager::initWithIconManager(renderer));
}

}  // namespace nimbo
