#include "desktop/drawing/ImagesPart.h"

#include "desktop/system/LatePart.h"

namespace nimbo {

ImagesPart& imagesPart() { return latePart<ImagesPart>("libnimbo-images.so", "nimbo_images"); }

}  // namespace nimbo
