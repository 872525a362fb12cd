// libnimbo-drawing.so: what DrawingPart.h declares.

#include "desktop/drawing/CairoImage.h"
#include "desktop/drawing/CairoShieldRenderer.h"
#include "desktop/drawing/CairoSurface.h"
#include "desktop/drawing/DrawingPart.h"
#include "desktop/drawing/PangoTextSystem.h"

namespace nimbo {

namespace {

class PangoAndCairo final : public DrawingPart {
  void lookForFonts() override { PangoTextSystem::lookForFonts(); }
  std::unique_ptr<TextSystem> makeTextSystem(const std::string& language) override {
    return std::make_unique<PangoTextSystem>(language);
  }
  std::unique_ptr<ImageResources> makeImages() override { return std::make_unique<CairoImageResources>(); }
  std::unique_ptr<ShieldIconRenderer> makeShieldRenderer(TextSystem& text) override {
    return std::make_unique<CairoShieldRenderer>(text);
  }
  Outcome<PictureRef> render(const DrawOperation& draw, Size size, double scale, const Color& background) override {
    const auto surface = renderToSurface(draw, size, scale, background);
    if (!surface) return surface.error();
    return PictureRef(*surface);
  }
};

}  // namespace

}  // namespace nimbo

extern "C" nimbo::DrawingPart* nimbo_drawing() {
  static nimbo::PangoAndCairo part;
  return &part;
}
