#include "platform/artwork/ArtworkImageSource.h"

#include "platform/foundation/Hash.h"

namespace nimbo {

std::shared_ptr<const NamedImage> NamedImage::imageNamed(std::string name) {
  return std::make_shared<const NamedImage>(std::move(name));
}

ImageRef NamedImage::imageToDisplayWithScreenScale_nightMode(double screenScale, bool nightMode) const {
  return ImageResources::current().image(_name, screenScale, nightMode);
}

const ArchivableClass& NamedImage::archivedClass() {
  static constexpr ArchivableClass archived{"NamedImage", [](KeyedDecoder& decoder) -> ObjectRef {
                                              auto name = decoder.decodeStringForKey("name");
                                              return name ? imageNamed(std::move(*name)) : nullptr;
                                            }};
  return archived;
}

void NamedImage::encodeWithCoder(KeyedEncoder& coder) const { coder.encodeString_forKey(_name, "name"); }

std::uint64_t NamedImage::hash() const { return hashOfBytes(_name); }

}  // namespace nimbo
