#pragma once

#include <memory>
#include <string>

#include "platform/artwork/ArtworkImageSource.h"

namespace nimbo {

inline constexpr double kFullArtworkAlpha = 1.0;
/// Of artworks that stand back. Alphas are compared exactly: single precision is part of the value.
inline constexpr double kDimmedArtworkAlpha = static_cast<double>(0.3f);

/// An image and the opacity at which it is drawn. Immutable.
class NBConfiguredArtwork : public Object {
 public:
  /// The source may be null; `alpha` from 0 to 1.
  static std::shared_ptr<const NBConfiguredArtwork> initWithArtworkSource_alpha(ArtworkImageSourceRef artworkSource,
                                                                                double alpha);
  NBConfiguredArtwork(ArtworkImageSourceRef artworkSource, double alpha)
      : _artworkSource(std::move(artworkSource)), _alpha(alpha) {}

  /// Null when there is nothing to draw.
  const ArtworkImageSourceRef& artworkSource() const { return _artworkSource; }
  double alpha() const { return _alpha; }

  /// The same alpha, and sources that are equal or archive to the same bytes, as two loads of one image do.
  bool isEqualToConfiguredArtwork(const NBConfiguredArtwork& other) const;

  std::string_view className() const override { return "NBConfiguredArtwork"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;

 private:
  ArtworkImageSourceRef _artworkSource;
  double _alpha;
};

using NBConfiguredArtworkRef = std::shared_ptr<const NBConfiguredArtwork>;

/// One of the widget's own images at an opacity: one object for each while the platform is in force, so that rows which
/// show it are found equal at a glance. Main thread only.
NBConfiguredArtworkRef artworkOfImageNamed(const std::string& name, double alpha);

}  // namespace nimbo
