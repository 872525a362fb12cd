#pragma once

#include <cstdint>
#include <memory>

#include "platform/artwork/ArtworkCache.h"
#include "platform/artwork/ArtworkImageSource.h"

namespace nimbo {

/// A transit artwork at a shield size, drawn through a cache. Immutable. Two are equal when artwork and size are.
class SizedTransitArtwork final : public ArtworkImageSource {
 public:
  /// The artwork may be null: nothing is drawn then. The cache is shared, not copied; not null.
  static std::shared_ptr<const SizedTransitArtwork> initWithArtwork_shieldSize_artworkCache(
      TransitArtworkRef artwork, std::int64_t shieldSize, std::shared_ptr<ArtworkCache> artworkCache);
  SizedTransitArtwork(TransitArtworkRef artwork, std::int64_t shieldSize, std::shared_ptr<ArtworkCache> artworkCache)
      : _artwork(std::move(artwork)), _shieldSize(shieldSize), _artworkCache(std::move(artworkCache)) {}

  const TransitArtworkRef& artwork() const { return _artwork; }
  /// One less is one size step smaller; 0 is the smallest.
  std::int64_t shieldSize() const { return _shieldSize; }
  const std::shared_ptr<ArtworkCache>& artworkCache() const { return _artworkCache; }

  ImageRef imageToDisplayWithScreenScale_nightMode(double screenScale, bool nightMode) const override;

  std::string_view className() const override { return "SizedTransitArtwork"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;

 private:
  TransitArtworkRef _artwork;
  std::int64_t _shieldSize;
  std::shared_ptr<ArtworkCache> _artworkCache;
};

}  // namespace nimbo
