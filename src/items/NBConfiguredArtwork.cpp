#include "items/NBConfiguredArtwork.h"

#include <map>
#include <utility>

#include "platform/Platform.h"
#include "platform/artwork/ArtworkImageSource.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

/// Whether both may stand in an archive and archive to the same bytes.
bool archiveAlike(const ArtworkImageSourceRef& a, const ArtworkImageSourceRef& b) {
  if (!dynamic_cast<const SecureCoding*>(a.get()) || !dynamic_cast<const SecureCoding*>(b.get())) return false;
  KeyedArchive& archive = Platform::current().archive();
  const auto first = archive.archivedDataWithRootObject(a, true), second = archive.archivedDataWithRootObject(b, true);
  return first && second && *first == *second;
}

}  // namespace

NBConfiguredArtworkRef NBConfiguredArtwork::initWithArtworkSource_alpha(ArtworkImageSourceRef artworkSource,
                                                                        double alpha) {
  return std::make_shared<const NBConfiguredArtwork>(std::move(artworkSource), alpha);
}

bool NBConfiguredArtwork::isEqualToConfiguredArtwork(const NBConfiguredArtwork& other) const {
  if (_alpha != other._alpha) return false;
  if (!_artworkSource || !other._artworkSource) return _artworkSource == other._artworkSource;
  return _artworkSource == other._artworkSource || _artworkSource->isEqual(other._artworkSource.get()) ||
         archiveAlike(_artworkSource, other._artworkSource);
}

bool NBConfiguredArtwork::isEqual(const Object* other) const {
  const auto* artwork = dynamic_cast<const NBConfiguredArtwork*>(other);
  return artwork && isEqualToConfiguredArtwork(*artwork);
}

std::uint64_t NBConfiguredArtwork::hash() const { return hashOfDouble(_alpha) ^ hashOf(_artworkSource); }

namespace {
struct NamedArtworks {
  std::map<std::pair<std::string, double>, NBConfiguredArtworkRef> made;
};
}  // namespace

NBConfiguredArtworkRef artworkOfImageNamed(const std::string& name, double alpha) {
  const auto artworks = Platform::current().singleton<NamedArtworks>([] { return std::make_shared<NamedArtworks>(); });
  NBConfiguredArtworkRef& artwork = artworks->made[{name, alpha}];
  if (!artwork) artwork = NBConfiguredArtwork::initWithArtworkSource_alpha(NamedImage::imageNamed(name), alpha);
  return artwork;
}

}  // namespace nimbo
