#include "platform/artwork/SizedTransitArtwork.h"

#include "platform/foundation/Hash.h"

namespace nimbo {

std::shared_ptr<const SizedTransitArtwork> SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(
    TransitArtworkRef artwork, std::int64_t shieldSize, std::shared_ptr<ArtworkCache> artworkCache) {
  return std::make_shared<const SizedTransitArtwork>(std::move(artwork), shieldSize, std::move(artworkCache));
}

ImageRef SizedTransitArtwork::imageToDisplayWithScreenScale_nightMode(double screenScale, bool nightMode) const {
  return _artworkCache ? _artworkCache->imageForArtwork(_artwork, _shieldSize, screenScale, nightMode) : nullptr;
}

bool SizedTransitArtwork::isEqual(const Object* other) const {
  if (this == other) return true;
  const auto* sized = instanceOf<SizedTransitArtwork>(other);
  return sized && sized->_shieldSize == _shieldSize && artworksAreEquivalent(sized->_artwork.get(), _artwork.get());
}

std::uint64_t SizedTransitArtwork::hash() const {
  return hashOf(_artwork) ^ (static_cast<std::uint64_t>(_shieldSize) * kHashMultiplier);
}

}  // namespace nimbo
