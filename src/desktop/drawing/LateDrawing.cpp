#include "desktop/drawing/LateDrawing.h"

#include "desktop/system/LatePart.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

void logMissing(const LatePartMissing& failure) {
  writeLog({kDefaultLogSubsystem, "Images"}, LogLevel::error, "No images are shown: %@", {failure.what()});
}

}  // namespace

DrawingPart& drawingPart() { return latePart<DrawingPart>("libnimbo-drawing.so", "nimbo_drawing"); }

TextSystem& LateDrawing::text() {
  if (!_text) _text = drawingPart().makeTextSystem(_language);
  return *_text;
}

FontMetrics LateDrawing::metrics(const FontDescriptor& font) { return text().metrics(font); }

TextLayoutRef LateDrawing::layOut(const std::string& text, const FontDescriptor& font, double maxWidth,
                                  std::size_t maxLines, bool rightToLeft) {
  return this->text().layOut(text, font, maxWidth, maxLines, rightToLeft);
}

ImageRef LateDrawing::image(std::string_view name, double screenScale, bool nightMode) try {
  if (!_images) _images = drawingPart().makeImages();
  return _images->image(name, screenScale, nightMode);
} catch (const LatePartMissing& failure) {
  logMissing(failure);
  return nullptr;
}

ImageRef LateDrawing::render(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale,
                             bool nightMode) try {
  if (!_shields) {
    _shields = drawingPart().makeShieldRenderer(text());
    _shields->setCachesIconAtlases(_cachesIconAtlases);
  }
  return _shields->render(artwork, shieldSize, screenScale, nightMode);
} catch (const LatePartMissing& failure) {
  logMissing(failure);
  return nullptr;
}

void LateDrawing::setCachesIconAtlases(bool caches) {
  _cachesIconAtlases = caches;
  if (_shields) _shields->setCachesIconAtlases(caches);
}

}  // namespace nimbo
