#include "items/NamedArtwork.h"

#include <map>
#include <utility>

#include "platform/Platform.h"
#include "platform/artwork/NamedImage.h"

namespace nimbo {

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
