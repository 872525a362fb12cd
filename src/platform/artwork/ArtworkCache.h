#pragma once

#include <cstdint>
#include <memory>

#include "platform/artwork/ArtworkImageSource.h"
#include "platform/transit/TransitArtwork.h"

namespace nimbo {

/// Draws shields and symbols. Main thread only.
class ShieldIconRenderer {
 public:
  virtual ~ShieldIconRenderer() = default;
  /// The artwork at a shield size from 0 (smallest) to 7; sizes outside are taken to the nearest. Null when the
  /// artwork has nothing to draw.
  virtual ImageRef render(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale,
                          bool nightMode) = 0;
  /// Whether the renderer keeps whole sheets of icons in memory. On until switched off.
  virtual void setCachesIconAtlases(bool caches) = 0;
};

/// Finds the renderer for an artwork.
class TransitArtworkManager {
 public:
  /// The renderer may be null: then nothing is drawn.
  static std::shared_ptr<TransitArtworkManager> initWithIconManager(std::shared_ptr<ShieldIconRenderer> renderer);
  explicit TransitArtworkManager(std::shared_ptr<ShieldIconRenderer> renderer) : _renderer(std::move(renderer)) {}

  ImageRef imageForArtwork(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale,
                           bool nightMode) const;

 private:
  std::shared_ptr<ShieldIconRenderer> _renderer;
};

/// Keeps drawn artworks until purged. Main thread only.
class ArtworkCache final {
 public:
  static std::shared_ptr<ArtworkCache> initWithArtworkManager(std::shared_ptr<TransitArtworkManager> manager);
  explicit ArtworkCache(std::shared_ptr<TransitArtworkManager> manager);
  ~ArtworkCache();

  /// Drawn on first use for each artwork, its colours included, size, scale and appearance. Null when there is nothing
  /// to draw.
  ImageRef imageForArtwork(const TransitArtworkRef& artwork, std::int64_t shieldSize, double screenScale,
                           bool nightMode);

  /// Drops all drawn images.
  void purge();

  /// Images held.
  std::size_t count() const;

 private:
  struct Entries;
  std::shared_ptr<TransitArtworkManager> _manager;
  std::unique_ptr<Entries> _entries;
};

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
