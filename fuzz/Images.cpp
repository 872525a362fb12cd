// Image files as whoever writes into a feed has them fetched.

#include "Fuzz.h"
#include "desktop/drawing/ImagesPart.h"

extern "C" nimbo::ImagesPart* nimbo_images();

namespace nimbo {

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  for (const int width : {1, 100}) {
    const auto image = nimbo_images()->decode(textOf(data, size), width);
    if (!image) continue;
    const Picture& picture = **image;
    require(picture.pixelWidth() > 0 && picture.pixelWidth() <= width, "an image is as wide as was asked for at most");
    require(picture.pixelHeight() > 0 && picture.pixelHeight() <= kLargestImageSide, "an image has a height");
    require(picture.stride() >= 4 * picture.pixelWidth(), "rows hold their pixels");
    require(picture.pixels().size() ==
                static_cast<std::size_t>(picture.stride()) * static_cast<std::size_t>(picture.pixelHeight()),
            "all rows are there");
  }
  return 0;
}

}  // namespace nimbo
