#pragma once

#include <map>
#include <string>
#include <tuple>

#include "platform/artwork/NamedImage.h"

namespace nimbo {

/// The images of resources/images, drawn as CairoImages. What the images leave to the current colour is drawn in
/// the label's. Drawn images are kept, a missing name is logged once.
class CairoImageResources final : public ImageResources {
 public:
  ImageRef image(std::string_view name, double screenScale, bool nightMode) override;

 private:
  std::map<std::tuple<std::string, double, bool>, ImageRef> _images;
};

}  // namespace nimbo
