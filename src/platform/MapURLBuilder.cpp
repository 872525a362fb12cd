#include "platform/MapURLBuilder.h"

#include "platform/HostApplication.h"

namespace nimbo {

URL MapURLBuilder::build() const {
  std::string text = std::string(kHostApplicationURLScheme) + "://?favorites=" + std::to_string(_favoritesType);
  if (_mapType == kMapTypeTransit) text += "&t=r";
  return URL(std::move(text));
}

}  // namespace nimbo
