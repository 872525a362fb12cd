#pragma once

#include <cstdint>
#include <memory>

#include "platform/artwork/Image.h"
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

}  // namespace nimbo
