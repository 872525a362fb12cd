#include "desktop/resources/Resources.h"

namespace nimbo {

std::optional<std::string_view> resourceNamed(std::string_view path) {
  for (std::size_t i = 0; i < kEmbeddedResourcesCount; ++i) {
    const EmbeddedResource& resource = kEmbeddedResourcesBegin[i];
    if (resource.path == path)
      return std::string_view(resource.begin, static_cast<std::size_t>(resource.end - resource.begin));
  }
  return std::nullopt;
}

}  // namespace nimbo
