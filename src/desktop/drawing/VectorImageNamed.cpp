#include "desktop/drawing/VectorImageNamed.h"

#include <string>

#include "desktop/resources/Resources.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

constexpr LogFacility kImagesLogFacility{kDefaultLogSubsystem, "Images"};

}  // namespace

std::shared_ptr<const VectorImage> vectorImageNamed(std::string_view name) {
  const auto svg = resourceNamed("images/" + std::string(name) + ".svg");
  if (!svg) {
    writeLog(kImagesLogFacility, LogLevel::error, "There is no image named %@; nothing is shown for it", {name});
    return nullptr;
  }
  VectorImage::Parsed parsed = VectorImage::parse(*svg);
  if (!parsed.image)
    writeLog(kImagesLogFacility, LogLevel::error, "The image %@ cannot be read: %@; nothing is shown for it",
             {name, parsed.problem});
  return parsed.image;
}

}  // namespace nimbo
