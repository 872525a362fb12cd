#include "platform/artwork/ArtworkCache.h"

#include <unordered_map>

#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

bool textColorsMatch(const std::optional<TransitShield>& a, const std::optional<TransitShield>& b) {
  return !a || !b || a->shieldTextColorString == b->shieldTextColorString;
}

/// Equivalent artworks may differ in the colour of their texts.
bool looksMatch(const TransitArtwork& a, const TransitArtwork& b) {
  return &a == &b || (artworksAreEquivalent(&a, &b) && textColorsMatch(a.shieldDataSource(), b.shieldDataSource()) &&
                      textColorsMatch(a.iconFallbackShieldDataSource(), b.iconFallbackShieldDataSource()));
}

struct Key {
  TransitArtworkRef artwork;
  std::int64_t shieldSize;
  double screenScale;
  bool nightMode;
  bool operator==(const Key& other) const {
    return shieldSize == other.shieldSize && screenScale == other.screenScale && nightMode == other.nightMode &&
           looksMatch(*artwork, *other.artwork);
  }
};

struct KeyHash {
  std::size_t operator()(const Key& key) const {
    return key.artwork->hash() ^ (static_cast<std::uint64_t>(key.shieldSize) * kHashMultiplier) ^
           hashOfDouble(key.screenScale) ^ (key.nightMode ? 1u : 0u);
  }
};

}  // namespace

struct ArtworkCache::Entries {
  std::unordered_map<Key, ImageRef, KeyHash> images;
};

std::shared_ptr<TransitArtworkManager> TransitArtworkManager::initWithIconManager(
    std::shared_ptr<ShieldIconRenderer> renderer) {
  return std::make_shared<TransitArtworkManager>(std::move(renderer));
}

ImageRef TransitArtworkManager::imageForArtwork(const TransitArtwork& artwork, std::int64_t shieldSize,
                                                double screenScale, bool nightMode) const {
  return _renderer ? _renderer->render(artwork, shieldSize, screenScale, nightMode) : nullptr;
}

std::shared_ptr<ArtworkCache> ArtworkCache::initWithArtworkManager(std::shared_ptr<TransitArtworkManager> manager) {
  return std::make_shared<ArtworkCache>(std::move(manager));
}

ArtworkCache::ArtworkCache(std::shared_ptr<TransitArtworkManager> manager)
    : _manager(std::move(manager)), _entries(std::make_unique<Entries>()) {}

ArtworkCache::~ArtworkCache() = default;

ImageRef ArtworkCache::imageForArtwork(const TransitArtworkRef& artwork, std::int64_t shieldSize, double screenScale,
                                       bool nightMode) {
  if (!artwork) return nullptr;
  const auto [entry, isNew] = _entries->images.try_emplace(Key{artwork, shieldSize, screenScale, nightMode});
  if (isNew) entry->second = _manager->imageForArtwork(*artwork, shieldSize, screenScale, nightMode);
  return entry->second;
}

void ArtworkCache::purge() { _entries->images.clear(); }

std::size_t ArtworkCache::count() const { return _entries->images.size(); }

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
